#pragma once

#include <string>

namespace android {

// Names that threads write and read without a lock. A race may mix two names; it must not touch
// freed memory, so such a text never outgrows its first storage as long as names are no longer than
// the platform allows, 255 bytes.

/** Gives `text`, which nobody else knows yet, its storage and its first value. */
void initSharedText(std::string* text, const char* value);

/** Copies `value` into the storage of `text`. */
void setSharedText(std::string* text, const std::string& value);

}  // namespace android
