#include <algorithm>
#include <cstdint>

#include <binder/IBinder.h>
#include <gui/ScreenCaptureResults.h>
#include <gui/SurfaceComposerClient.h>
#include <hardware/gralloc.h>
#include <ui/GraphicBuffer.h>
#include <ui/GraphicTypes.h>
#include <ui/PixelFormat.h>
#include <ui/Rect.h>
#include <utils/Errors.h>
#include <utils/StrongPointer.h>

#include "core/Log.h"
#include "core/SDCImpl.h"
#include "rgb/CaptureForms.h"
#include "rgb/ColorAverage.h"
#include "rgb/RgbShotManager.h"
#include "rgb/SyncScreenCaptureListener.h"

namespace android {

// One piece, so that it releases in this order: buffer, results, listener, request, token.
int RgbShotManager::getScreenPixcel(int* rgbOut, int* rect) {
    if (std::all_of(rect, rect + 4, [](int value) { return value == 0; })) {
        // [sic] Written while `mLogSwitch` is 0 too.
        SENSOR_PRIV_LOGD("ic scope is 0. not support pixcel");
        return 0;
    }
    const sp<IBinder> token = forms::internalDisplayToken<SurfaceComposerClient>();
    if (token == nullptr) {
        SENSOR_PRIV_LOGE("Unable to get handle for display");
        return 0;
    }

    forms::CaptureRequest request;
    request.displayToken = token;
    forms::setField(&forms::captureArgs(&request)->pixelFormat, ui::PixelFormat::RGBA_8888);
    forms::captureSecureLayers(forms::captureArgs(&request));
    const Rect area(rect[0], rect[1], rect[2], rect[3]);

    const sp<sensor_priv::SyncScreenCaptureListener> listener =
            new sensor_priv::SyncScreenCaptureListener;
    if (forms::setArea<SurfaceComposerClient>(&request, area) != OK ||
        ScreenshotClient::captureDisplay(request, listener) != OK) {
        SENSOR_PRIV_LOGE("UL: captureDisplay failed!");
        return 0;
    }
    const gui::ScreenCaptureResults results = listener->waitForResults();
    if (forms::statusOf(results) != OK) {
        SENSOR_PRIV_LOGE("UL: captureResults failed!");
        return 0;
    }

    // Not tested for null: a good result has a buffer.
    const sp<GraphicBuffer> buffer = results.buffer;
    void* base = nullptr;
    if (buffer->lock(GRALLOC_USAGE_SW_READ_OFTEN, &base) != OK || base == nullptr) {
        // Unlocks even if the lock failed. [sic] The text ends in a blank.
        buffer->unlock();
        SENSOR_PRIV_LOGE("UL: rgb update fail, base is NULL ");
        return 0;
    }
    const uint32_t width = buffer->getWidth();
    const uint32_t height = buffer->getHeight();
    const uint32_t stride = buffer->getStride();
    const PixelFormat format = buffer->getPixelFormat();
    // The pixels are read after the unlock: the mapping lasts as long as the buffer, which is held
    // until the return.
    buffer->unlock();
    averageColor(base, width, height, stride, format, rgbOut);

    SDCImpl::getInstance()->setRgbShotCount();
    if (mLogSwitch != 0) {
        SENSOR_PRIV_LOGD("UL: Pixcel changed: red = %d, green = %d, blue = %d", rgbOut[0],
                         rgbOut[1], rgbOut[2]);
    }
    return 1;
}

}  // namespace android
