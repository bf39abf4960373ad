#pragma once

#include <cstdint>
#include <type_traits>

#include <binder/IBinder.h>
#include <gui/SurfaceComposerClient.h>
#include <ui/DisplayState.h>
#include <ui/Fence.h>
#include <ui/Rect.h>
#include <utils/Errors.h>
#include <utils/StrongPointer.h>

// What a version's gui/SurfaceComposerClient.h may only declare. The order matters: the build may
// generate a file of the second name that only refuses to be included.
#if __has_include(<gui/DisplayCaptureArgs.h>)
#include <gui/DisplayCaptureArgs.h>
#elif __has_include(<android/gui/DisplayCaptureArgs.h>)
#include <android/gui/DisplayCaptureArgs.h>
#endif

#include "core/Arithmetic.h"

namespace android {

inline namespace sensor_priv {

/**
 * The capture calls of platform versions 12 to 16, whose forms differ, as one form. No version
 * number tells the forms apart, so the compiler looks at what the platform's headers declare: of
 * two overloads, the one with `First` counts if all that its signature names is there. The
 * platform's types are parameters, so that a test can put any form in their place.
 */
namespace forms {

struct Second {};
struct First : Second {};

namespace either {
using namespace gui;  // in which it is from 13 on; at 12 it is in `android`
using Request = DisplayCaptureArgs;
}  // namespace either

/** What `ScreenshotClient::captureDisplay` takes. */
using CaptureRequest = either::Request;

/** Wraps at 2^32. */
constexpr int32_t subtractWrapped(int32_t from, int32_t amount) {
    return addWrapped(from, -int64_t{amount});
}

// The internal display. Until 13 the platform names it. Later it is the first one of all displays.

template <typename Client>
auto internalDisplayToken(First) -> decltype(Client::getInternalDisplayToken()) {
    return Client::getInternalDisplayToken();
}

template <typename Client>
sp<IBinder> internalDisplayToken(Second) {
    const auto ids = Client::getPhysicalDisplayIds();
    if (ids.empty()) return nullptr;
    return Client::getPhysicalDisplayToken(ids.front());
}

/** The internal display's token. Null if there is none. */
template <typename Client>
sp<IBinder> internalDisplayToken() {
    return internalDisplayToken<Client>(First());
}

// Format, crop and layers: from 15 QPR1 on in a record within the request.

template <typename Request>
auto captureArgs(Request* request, First) -> decltype(&request->captureArgs) {
    return &request->captureArgs;
}

template <typename Request>
Request* captureArgs(Request* request, Second) {
    return request;
}

/** The part of the request that all kinds of captures have. */
template <typename Request>
auto* captureArgs(Request* request) {
    return captureArgs(request, First());
}

/** Sets a field that is an enum, or the number behind it. */
template <typename Field, typename Value>
void setField(Field* field, Value value) {
    *field = static_cast<Field>(value);
}

// Secure layers: until 16 QPR1 a flag, later a mode.

template <typename Args>
auto captureSecureLayers(Args* args, First) -> decltype(args->captureSecureLayers = true, void()) {
    args->captureSecureLayers = true;
}

template <typename Args>
void captureSecureLayers(Args* args, Second) {
    args->secureLayerMode = decltype(args->secureLayerMode)::Capture;
}

/** Asks for the secure layers' true content. */
template <typename Args>
void captureSecureLayers(Args* args) {
    captureSecureLayers(args, First());
}

/**
 * Turns `area` from the panel's coordinates to the present ones, which `state` describes. In the
 * panel's coordinates the display is as large as in orientation 0. Wraps at 32 bits.
 */
template <typename DisplayState>
Rect toPresent(const Rect& area, const DisplayState& state) {
    const int32_t width = state.layerStackSpaceRect.width;
    const int32_t height = state.layerStackSpaceRect.height;
    switch (static_cast<int>(state.orientation)) {  // quarter turns
        case 1:
            return Rect(area.top, subtractWrapped(height, area.right), area.bottom,
                        subtractWrapped(height, area.left));
        case 2:
            return Rect(subtractWrapped(width, area.right), subtractWrapped(height, area.bottom),
                        subtractWrapped(width, area.left), subtractWrapped(height, area.top));
        case 3:
            return Rect(subtractWrapped(width, area.bottom), area.left,
                        subtractWrapped(width, area.top), area.right);
    }
    return area;
}

// The coordinates of the crop. Until 14.0 the platform takes the panel's ones if it is told so, and
// then turns the picture back. Later it takes the present ones.

template <typename Client, typename Request>
auto takePanelsArea(Request* request, Rect*, First)
        -> decltype(request->useIdentityTransform = true, status_t()) {
    request->useIdentityTransform = true;
    return OK;
}

template <typename Client, typename Request>
status_t takePanelsArea(Request* request, Rect* area, Second) {
    ui::DisplayState state;
    const status_t status = Client::getDisplayState(request->displayToken, &state);
    if (status == OK) *area = toPresent(*area, state);
    return status;
}

/**
 * Asks for `area` of the panel, unscaled. It stays where it is on the glass when the display's
 * content is turned; the picture may come turned. Wants the request's token.
 */
template <typename Client, typename Request>
status_t setArea(Request* request, Rect area) {
    if (status_t status = takePanelsArea<Client>(request, &area, First())) return status;
    auto& crop = captureArgs(request)->sourceCrop;
    crop.left = area.left;
    crop.top = area.top;
    crop.right = area.right;
    crop.bottom = area.bottom;
    setField(&request->width, subtractWrapped(area.right, area.left));
    setField(&request->height, subtractWrapped(area.bottom, area.top));
    return OK;
}

// The results: until 13 a fence and a status, later either of them.

template <typename Results>
auto waitForBuffer(Results* results, First) -> decltype(results->fenceResult.has_value(), void()) {
    auto& fence = results->fenceResult;
    if (!fence.has_value()) return;
    const status_t status = fence.value()->waitForever("");
    if (status != OK) fence = typename std::decay_t<decltype(fence)>::unexpected_type(status);
}

template <typename Results>
void waitForBuffer(Results* results, Second) {
    const status_t status = results->fence->waitForever("");
    if (results->result == OK) results->result = status;
}

/** Blocks until the buffer is complete. The results have failed if the wait fails. */
template <typename Results>
void waitForBuffer(Results* results) {
    waitForBuffer(results, First());
}

template <typename Results>
auto statusOf(const Results& results, First)
        -> decltype(results.fenceResult.has_value(), status_t()) {
    if (results.fenceResult.has_value()) return OK;
    return results.fenceResult.error();
}

template <typename Results>
status_t statusOf(const Results& results, Second) {
    return results.result;
}

/** `OK`, or why the capture failed. */
template <typename Results>
status_t statusOf(const Results& results) {
    return statusOf(results, First());
}

}  // namespace forms

}  // namespace sensor_priv

}  // namespace android
