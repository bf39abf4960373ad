#include "platform/PropertyService.h"

#include <algorithm>
#include <cstring>
#include <filesystem>
#include <memory>
#include <mutex>
#include <string_view>
#include <utility>

#include <cutils/properties.h>
#include <sqlite3.h>

namespace {

/** What the device's property service reads of a name from its socket at most. */
constexpr size_t kMaxName = 0xffff;

/** Longest value, without its NUL. */
constexpr size_t kMaxValue = PROP_VALUE_MAX - 1;

constexpr char kSchema[] =
        "CREATE TABLE IF NOT EXISTS properties (name TEXT PRIMARY KEY, value TEXT NOT NULL)"
        " WITHOUT ROWID";

bool startsWith(std::string_view text, std::string_view prefix) {
    return text.substr(0, prefix.size()) == prefix;
}

/** How long a process waits for others at a file. */
constexpr int kBusyMs = 10'000;

/** One open database with its statements; what fails is remembered, the first failure only. */
class Store {
public:
    /** In memory. */
    Store() : Store("memory", ":memory:") {}

    /** In a file. Its path is made absolute: SQLite has a meaning of its own for some names. */
    explicit Store(const std::string& path)
          : Store(path, path.empty() ? "/" : std::filesystem::absolute(path).string()) {}

    ~Store() {
        for (sqlite3_stmt* statement : {mGet, mSet, mErase}) sqlite3_finalize(statement);
        sqlite3_close(mDb);
    }

    Store(const Store&) = delete;
    Store& operator=(const Store&) = delete;

    const std::optional<std::string>& error() const { return mError; }

    std::optional<std::string> get(std::string_view name) {
        if (mError) return std::nullopt;
        std::optional<std::string> value;
        bind(mGet, 1, name);
        const int status = sqlite3_step(mGet);
        if (status == SQLITE_ROW) {
            // Whoever else writes the file may have put longer values there.
            const unsigned char* text = sqlite3_column_text(mGet, 0);
            const auto size = static_cast<size_t>(sqlite3_column_bytes(mGet, 0));
            value.emplace(reinterpret_cast<const char*>(text), std::min(size, kMaxValue));
        } else if (status != SQLITE_DONE) {
            check(status);
        }
        sqlite3_reset(mGet);
        return value;
    }

    bool set(std::string_view name, std::string_view value) {
        if (mError) return false;
        bind(mSet, 2, value);
        return change(mSet, name);
    }

    bool erase(std::string_view name) { return !mError && change(mErase, name); }

    void run(const char* sql) {
        if (!mError) check(sqlite3_exec(mDb, sql, nullptr, nullptr, nullptr));
    }

    std::vector<unsigned char> save() {
        sqlite3_int64 size = 0;
        unsigned char* bytes = sqlite3_serialize(mDb, "main", &size, 0);
        std::vector<unsigned char> copy(bytes, bytes + size);
        sqlite3_free(bytes);
        return copy;
    }

    void restore(const std::vector<unsigned char>& bytes) {
        auto* copy = static_cast<unsigned char*>(sqlite3_malloc64(bytes.size()));
        std::memcpy(copy, bytes.data(), bytes.size());
        const auto size = static_cast<sqlite3_int64>(bytes.size());
        check(sqlite3_deserialize(mDb, "main", copy, size, size,
                                  SQLITE_DESERIALIZE_FREEONCLOSE | SQLITE_DESERIALIZE_RESIZEABLE));
    }

private:
    Store(const std::string& name, const std::string& path) : mName(name) {
        check(sqlite3_open_v2(path.c_str(), &mDb, SQLITE_OPEN_READWRITE | SQLITE_OPEN_CREATE,
                              nullptr));
        sqlite3_busy_timeout(mDb, kBusyMs);
        // A write-ahead log makes each write one append. The kernel keeps what a killed process
        // has written, so nothing has to be synced: only a power cut could lose a write.
        switchToLog();
        run("PRAGMA synchronous = OFF");
        checkPages();
        run(kSchema);
        mGet = prepare("SELECT value FROM properties WHERE name = ?1");
        mSet =
                prepare("INSERT INTO properties VALUES (?1, ?2)"
                        " ON CONFLICT (name) DO UPDATE SET value = excluded.value");
        mErase = prepare("DELETE FROM properties WHERE name = ?1");
        // Tells at once whether the file can be written.
        run("BEGIN IMMEDIATE; PRAGMA user_version = 1; COMMIT");
    }

    /** Does not wait by itself while another process does the same. */
    void switchToLog() {
        int status = SQLITE_BUSY;
        for (int waited = 0; status == SQLITE_BUSY && waited < kBusyMs; ++waited) {
            if (waited > 0) sqlite3_sleep(1);
            status = sqlite3_exec(mDb, "PRAGMA journal_mode = WAL", nullptr, nullptr, nullptr);
        }
        check(status);
    }

    void check(int status) {
        if (status == SQLITE_OK || mError) return;
        mError = mName + ": cannot keep properties in this file: " + sqlite3_errstr(status);
    }

    /** A damaged page would otherwise show only when it is read. */
    void checkPages() {
        sqlite3_stmt* statement = prepare("PRAGMA quick_check(1)");
        if (mError) return;
        const int status = sqlite3_step(statement);
        if (status != SQLITE_ROW) {
            check(status);
        } else if (reinterpret_cast<const char*>(sqlite3_column_text(statement, 0)) !=
                   std::string_view("ok")) {
            check(SQLITE_CORRUPT);
        }
        sqlite3_finalize(statement);
    }

    sqlite3_stmt* prepare(const char* sql) {
        sqlite3_stmt* statement = nullptr;
        if (!mError) check(sqlite3_prepare_v2(mDb, sql, -1, &statement, nullptr));
        return statement;
    }

    /** `text` must stay as it is until the statement is reset. */
    void bind(sqlite3_stmt* statement, int index, std::string_view text) {
        check(sqlite3_bind_text(statement, index, text.data(), static_cast<int>(text.size()),
                                SQLITE_STATIC));
    }

    bool change(sqlite3_stmt* statement, std::string_view name) {
        bind(statement, 1, name);
        const bool changed = sqlite3_step(statement) == SQLITE_DONE;
        if (!changed) check(sqlite3_errcode(mDb));
        sqlite3_reset(statement);
        return changed;
    }

    const std::string mName;
    sqlite3* mDb = nullptr;
    sqlite3_stmt* mGet = nullptr;
    sqlite3_stmt* mSet = nullptr;
    sqlite3_stmt* mErase = nullptr;
    std::optional<std::string> mError;
};

/** Never destroyed: the library's worker may write until the process is gone. */
struct Service {
    std::mutex mutex;
    std::unique_ptr<Store> store = std::make_unique<Store>();
    std::function<void(const char*, const char*)> observer;

    static Service& get() {
        static auto* const instance = new Service;
        return *instance;
    }
};

/** How `property_set` differs from a write by the rest of the device. */
int setFromLibrary(Service& service, std::string_view name, std::string_view value) {
    const std::lock_guard lock(service.mutex);
    if (platform::refuseProperty(name, value)) return -1;
    if (startsWith(name, "ro.") && service.store->get(name).has_value()) return -1;
    return service.store->set(name, value) ? 0 : -1;
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

std::optional<std::string> openProperties(const std::string& path) {
    auto store = std::make_unique<Store>(path);
    if (store->error()) return store->error();
    Service& service = Service::get();
    const std::lock_guard lock(service.mutex);
    service.store = std::move(store);
    return std::nullopt;
}

void closeProperties() {
    Service& service = Service::get();
    const std::lock_guard lock(service.mutex);
    service.store = std::make_unique<Store>();
}

std::optional<std::string> propertyFileError() {
    Service& service = Service::get();
    const std::lock_guard lock(service.mutex);
    return service.store->error();
}

void dropVolatileProperties() {
    Service& service = Service::get();
    const std::lock_guard lock(service.mutex);
    service.store->run(
            "DELETE FROM properties"
            " WHERE name NOT GLOB 'persist.*' AND name NOT GLOB 'ro.*'");
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
