#include "record/Library.h"

#include <cstdlib>

#include <android/log.h>
#include <dlfcn.h>

#include "record/Log.h"

namespace record {

namespace {

[[noreturn]] void failToFind(const char* name) {
    __android_log_print(ANDROID_LOG_FATAL, kLogTag, "%s is not there to be handed on to", name);
    std::abort();
}

/** The library, which the host has loaded; one that links its calls only may have left it out. */
void* library() {
    static std::atomic<void*> found{nullptr};
    void* handle = found.load(std::memory_order_acquire);
    if (handle == nullptr) {
        handle = dlopen("libsensor-priv.so", RTLD_NOW | RTLD_LOCAL);
        found.store(handle, std::memory_order_release);
    }
    return handle;
}

void* findInLibrary(const char* name) {
    void* address = library() != nullptr ? dlsym(library(), name) : nullptr;
    if (address == nullptr) failToFind(name);
    return address;
}

}  // namespace

void* findNext(const char* name) {
    void* const next = dlsym(RTLD_NEXT, name);
    return next != nullptr ? next : findInLibrary(name);
}

void* findReal(const void* address) {
    Dl_info info{};
    if (dladdr(address, &info) == 0 || info.dli_sname == nullptr) failToFind("a call");
    return findInLibrary(info.dli_sname);
}

const void* findVariable(const char* name) {
    // A program may hold its own copy, which the library then uses as well.
    const void* address = dlsym(RTLD_DEFAULT, name);
    if (address != nullptr || library() == nullptr) return address;
    return dlsym(library(), name);
}

}  // namespace record
