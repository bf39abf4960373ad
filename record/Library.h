#pragma once

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

/** The library's own `operation`, as a function that takes the object first. */
template <typename Result, typename Class, typename... Parameters>
auto real(Result (Class::*operation)(Parameters...)) {
    // The platform's ABI: a pointer to a member that is not virtual begins with the address, and
    // the object is passed as a first parameter would be.
    const void* address = nullptr;
    std::memcpy(&address, &operation, sizeof(address));
    return reinterpret_cast<Result (*)(Class*, Parameters...)>(findReal(address));
}

template <typename Result, typename... Parameters>
auto real(Result (*operation)(Parameters...)) {
    return reinterpret_cast<Result (*)(Parameters...)>(
            findReal(reinterpret_cast<const void*>(operation)));
}

}  // namespace record
