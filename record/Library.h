#pragma once

#include <atomic>
#include <cstdint>
#include <cstring>

namespace record {

/**
 * What `name` means behind the recorder: the next one in the order of the loaded libraries, or the
 * one that the library itself would find. Ends the process if there is none, since the call could
 * not be handed on.
 */
void* findNext(const char* name);

/** The library's own function of the same name as the function at `address`, the recorder's. */
void* findReal(const void* address);

/** The exported variable `name` as the library sees it; null if it has none. */
const void* findVariable(const char* name);

/**
 * A function that is looked for at its first call. Unlike a local static with an initialiser, it
 * can be asked for again while it is looked for: by the log function of the host, or in a forked
 * child.
 */
template <typename Function>
class Found {
public:
    template <typename Find>
    Function get(Find find) {
        Function function = mFunction.load(std::memory_order_acquire);
        if (function == nullptr) {
            function = reinterpret_cast<Function>(find());
            mFunction.store(function, std::memory_order_release);
        }
        return function;
    }

private:
    std::atomic<Function> mFunction{nullptr};
};

/** The function `name` behind the recorder. */
template <typename Function>
Function next(Found<Function>* found, const char* name) {
    return found->get([name] { return findNext(name); });
}

template <typename Operation>
struct AsFunction;
template <typename Result, typename Class, typename... Parameters>
struct AsFunction<Result (Class::*)(Parameters...)> {
    using Type = Result (*)(Class*, Parameters...);
};
template <typename Result, typename... Parameters>
struct AsFunction<Result (*)(Parameters...)> {
    using Type = Result (*)(Parameters...);
};

/** The library's own `Operation`, as a function that takes the object, if any, first. */
template <auto Operation>
auto real() {
    static Found<typename AsFunction<decltype(Operation)>::Type> found;
    return found.get([] {
        // The platform's ABI: a pointer to a member that is not virtual begins with the address,
        // and the object is passed as a first parameter would be.
        const auto operation = Operation;
        const void* address = nullptr;
        std::memcpy(&address, &operation, sizeof(address));
        return findReal(address);
    });
}

/** Nanoseconds of the monotonic clock, which never stands still here. */
int64_t realNow();

}  // namespace record
