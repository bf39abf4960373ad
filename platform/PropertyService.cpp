#include "platform/PropertyService.h"

#include <cstring>
#include <memory>
#include <mutex>
#include <utility>

#include <cutils/properties.h>

#include "platform/PropertyStore.h"
#include "platform/StoreFile.h"

namespace {

/** The longest name that the device's property service reads from its socket. */
constexpr size_t kMaxName = 0xffff;

/** The longest value, without its NUL. */
constexpr size_t kMaxValue = PROP_VALUE_MAX - 1;

bool startsWith(std::string_view text, std::string_view prefix) {
    return text.substr(0, prefix.size()) == prefix;
}

/** Never destroyed: the library's worker may set properties until the process ends. */
struct Service {
    std::mutex mutex;
    std::unique_ptr<platform::PropertyStore> store = std::make_unique<platform::PropertyStore>();
    std::shared_ptr<const platform::StoreFile> pinned;
    std::function<void(const char*, const char*)> observer;

    static Service& get() {
        static auto* const instance = new Service;
        return *instance;
    }
};

/** `property_set` under the mutex: unlike the rest of the device, it sets an `ro.*` once. */
int setFromLibrary(Service& service, std::string_view name, std::string_view value) {
    const std::lock_guard lock(service.mutex);
    if (platform::refuseProperty(name, value)) return -1;
    const bool isSet = startsWith(name, "ro.") ? service.store->add(name, value)
                                               : service.store->set(name, value);
    return isSet ? 0 : -1;
}

}  // namespace

extern "C" int property_get(const char* key, char* value, const char* default_value) {
    Service& service = Service::get();
    std::string text;
    {
        const std::lock_guard lock(service.mutex);
        text = service.store->get(key).value_or("");
    }
    // The length of an unset property is 0, or that of the default.
    if (text.empty() && default_value != nullptr) {
        text.assign(default_value, strnlen(default_value, kMaxValue));
    } else if (text.empty()) {
        value[0] = '\0';
        return 0;
    }
    std::memcpy(value, text.c_str(), text.size() + 1);
    return static_cast<int>(text.size());
}

extern "C" int property_set(const char* key, const char* value) {
    if (key == nullptr) return -1;
    if (value == nullptr) value = "";
    Service& service = Service::get();
    const int status = setFromLibrary(service, key, value);
    if (status == 0 && service.observer) service.observer(key, value);
    return status;
}

namespace platform {

namespace {

std::shared_ptr<const StoreFile> fileOf(const Service& service, const std::string& path) {
    const bool isPinned = service.pinned != nullptr && service.pinned->path() == path;
    return isPinned ? service.pinned : std::make_shared<const StoreFile>(path);
}

}  // namespace

std::optional<std::string> pinPropertyFile(const std::string& path) {
    Service& service = Service::get();
    const std::lock_guard lock(service.mutex);
    const auto file = fileOf(service, path);
    if (auto error = file->refuse()) return error;
    service.pinned = file;
    return std::nullopt;
}

std::optional<std::string> openProperties(const std::string& path) {
    Service& service = Service::get();
    const std::lock_guard lock(service.mutex);
    const auto file = fileOf(service, path);
    if (auto error = file->refuse()) return error;
    auto store = std::make_unique<PropertyStore>(file);
    if (store->error()) return store->error();
    service.store = std::move(store);
    return std::nullopt;
}

std::optional<std::string> closeProperties() {
    Service& service = Service::get();
    const std::lock_guard lock(service.mutex);
    service.store->checkPlace();
    auto error = service.store->error();
    service.store = std::make_unique<PropertyStore>();
    return error;
}

std::optional<std::string> propertyFileError() {
    Service& service = Service::get();
    const std::lock_guard lock(service.mutex);
    return service.store->error();
}

void dropVolatileProperties() {
    Service& service = Service::get();
    const std::lock_guard lock(service.mutex);
    service.store->eraseVolatile();
}

std::optional<std::string> refuseProperty(std::string_view name, std::string_view value) {
    if (name.empty()) return "a property needs a name";
    if (name.size() > kMaxName) {
        return "a property's name has at most " + std::to_string(kMaxName) + " bytes";
    }
    if (value.size() > kMaxValue) {
        return "a property's value has at most " + std::to_string(kMaxValue) + " bytes";
    }
    return std::nullopt;
}

void setDeviceProperty(const std::string& name, const std::optional<std::string>& value) {
    if (refuseProperty(name, value.value_or(""))) return;
    Service& service = Service::get();
    const std::lock_guard lock(service.mutex);
    if (value) {
        service.store->set(name, *value);
    } else {
        service.store->erase(name);
    }
}

void observePropertySet(std::function<void(const char*, const char*)> observer) {
    Service::get().observer = std::move(observer);
}

std::vector<unsigned char> saveProperties() {
    Service& service = Service::get();
    const std::lock_guard lock(service.mutex);
    return service.store->save();
}

void restoreProperties(const std::vector<unsigned char>& bytes) {
    Service& service = Service::get();
    const std::lock_guard lock(service.mutex);
    service.store->restore(bytes);
}

}  // namespace platform
