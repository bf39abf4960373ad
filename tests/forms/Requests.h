#pragma once

#include <cstdint>

#include <ui/GraphicTypes.h>
#include <ui/Rect.h>

#include "tests/forms/Forms.h"

namespace form {

struct CaptureArgs12 {
    virtual ~CaptureArgs12() = default;

    android::ui::PixelFormat pixelFormat{android::ui::PixelFormat::RGBA_8888};
    android::Rect sourceCrop;
    float frameScaleX{1};
    float frameScaleY{1};
    bool captureSecureLayers{false};
};

struct DisplayCaptureArgs14Qpr3 : CaptureArgs12 {
    sp<IBinder> displayToken;
    uint32_t width{0};
    uint32_t height{0};
};

struct DisplayCaptureArgs12 : DisplayCaptureArgs14Qpr3 {
    bool useIdentityTransform{false};
};

/** A parcelable's rectangle, which has members alone. */
struct ARect {
    int32_t left;
    int32_t top;
    int32_t right;
    int32_t bottom;
};

struct CaptureArgs15Qpr1 {
    int32_t pixelFormat = 1;
    ARect sourceCrop = {};
    bool captureSecureLayers = false;
};

enum class SecureLayerMode : int32_t { Redact, Capture, Error };

struct CaptureArgs16Qpr2 {
    int32_t pixelFormat = 1;
    ARect sourceCrop = {};
    SecureLayerMode secureLayerMode = SecureLayerMode::Redact;
};

template <typename CaptureArgs>
struct DisplayCaptureArgs15Qpr1 {
    CaptureArgs captureArgs;
    sp<IBinder> displayToken;
    int32_t width = 0;
    int32_t height = 0;
};

}  // namespace form
