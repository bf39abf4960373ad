#pragma once

#include <string>

namespace android {

/**
 * Prepares a text that threads write and read without a lock: it keeps its storage for as long as
 * names in it are no longer than the platform allows, 255 bytes. A race may then mix two names, but
 * never touches freed memory. Assign copies to it; a move would swap the storage.
 */
inline void keepStorage(std::string* text) {
    text->reserve(255);
}

}  // namespace android
