#include "core/SharedText.h"

#include <algorithm>

namespace android {

SharedText::SharedText(const std::string& text) {
    set(text);
}

void SharedText::set(const std::string& text) {
    const size_t size = std::min(text.size(), kMaxBytes);
    for (size_t i = 0; i < size; ++i) mBytes[i].store(text[i], std::memory_order_relaxed);
    mSize.store(size, std::memory_order_relaxed);
}

std::string SharedText::get() const {
    // During a `set`, bytes that it has not reached yet are those of an older name, or 0.
    std::string text(mSize.load(std::memory_order_relaxed), '\0');
    for (size_t i = 0; i < text.size(); ++i) text[i] = mBytes[i].load(std::memory_order_relaxed);
    return text;
}

}  // namespace android
