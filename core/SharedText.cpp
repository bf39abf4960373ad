#include "core/SharedText.h"

namespace android {

void initSharedText(std::string* text, const char* value) {
    text->reserve(255);
    text->assign(value);
}

void setSharedText(std::string* text, const std::string& value) {
    text->assign(value);
}

}  // namespace android
