/**
 * All that the library asks of the platform's headers, as assertions for the compiler. They hold
 * for platform versions 12 to 16, on 32 and 64 bits. What differs between these goes through
 * rgb/CaptureForms.h, here as in the library. On another version, the assertions that fail say what
 * a port has to replace. The file defines nothing.
 *
 * In a platform tree, let the library's module compile it once:
 *     sed -i 's|"usage/\*.cpp",|& "platform/PlatformSignatures.cpp",|' Android.bp && m
 * libsensor-priv
 *
 * By itself, from the project's folder, with one -isystem for each folder of platform headers:
 *     clang++-14 -std=gnu++17 -fsyntax-only -I. -isystem platform/include \
 *         -isystem /usr/include/android platform/PlatformSignatures.cpp
 */

#include <cstddef>
#include <cstdint>
#include <type_traits>
#include <utility>

#include <android/gui/BnScreenCaptureListener.h>
#include <android/log.h>
#include <binder/IBinder.h>
#include <binder/Status.h>
#include <cutils/properties.h>
#include <gui/ScreenCaptureResults.h>
#include <gui/SurfaceComposerClient.h>
#include <hardware/gralloc.h>
#include <hardware/sensors.h>
#include <ui/DisplayState.h>
#include <ui/Fence.h>
#include <ui/GraphicBuffer.h>
#include <ui/GraphicTypes.h>
#include <ui/PixelFormat.h>
#include <ui/Rect.h>
#include <utils/Errors.h>
#include <utils/Looper.h>
#include <utils/Mutex.h>
#include <utils/RefBase.h>
#include <utils/String8.h>
#include <utils/StrongPointer.h>
#include <utils/SystemClock.h>
#include <utils/Thread.h>
#include <utils/Timers.h>
#include <utils/Vector.h>

#include "rgb/CaptureForms.h"

/** `expression`, or the member `expression`, has exactly that type. */
#define REQUIRE_TYPE(expression, ...) \
    static_assert(std::is_same_v<decltype(expression), __VA_ARGS__>, #expression)

namespace android {
namespace {

/** An object to make calls on. */
template <typename Type>
Type& any();

/** An enum or a number of 32 bits. */
template <typename Field>
constexpr bool isWord() {
    return (std::is_enum_v<Field> || std::is_integral_v<Field>)&&sizeof(Field) == 4;
}

// The display.

REQUIRE_TYPE(forms::internalDisplayToken<SurfaceComposerClient>(), sp<IBinder>);
static_assert(std::is_base_of_v<RefBase, IBinder>);
REQUIRE_TYPE(any<SurfaceComposerClient>().getDisplayState(any<sp<IBinder>>(),
                                                          std::declval<ui::DisplayState*>()),
             status_t);
static_assert(isWord<decltype(ui::DisplayState::orientation)>());
REQUIRE_TYPE(any<ui::DisplayState>().layerStackSpaceRect.width, int32_t);
REQUIRE_TYPE(any<ui::DisplayState>().layerStackSpaceRect.height, int32_t);

// The request of a capture.

using Request = forms::CaptureRequest;
using Args = std::remove_pointer_t<decltype(forms::captureArgs(std::declval<Request*>()))>;

static_assert(std::is_default_constructible_v<Request>);
REQUIRE_TYPE(Request::displayToken, sp<IBinder>);
static_assert(isWord<decltype(Request::width)>());
static_assert(isWord<decltype(Request::height)>());
static_assert(isWord<decltype(Args::pixelFormat)>());
REQUIRE_TYPE(any<Args>().sourceCrop.left, int32_t);
REQUIRE_TYPE(any<Args>().sourceCrop.top, int32_t);
REQUIRE_TYPE(any<Args>().sourceCrop.right, int32_t);
REQUIRE_TYPE(any<Args>().sourceCrop.bottom, int32_t);
REQUIRE_TYPE(forms::captureSecureLayers(std::declval<Args*>()), void);
static_assert(static_cast<int32_t>(ui::PixelFormat::RGBA_8888) == 1);

static_assert(std::is_constructible_v<Rect, int32_t, int32_t, int32_t, int32_t>);
REQUIRE_TYPE(Rect::left, int32_t);
REQUIRE_TYPE(Rect::top, int32_t);
REQUIRE_TYPE(Rect::right, int32_t);
REQUIRE_TYPE(Rect::bottom, int32_t);

REQUIRE_TYPE(ScreenshotClient::captureDisplay(any<const Request>(),
                                              any<const sp<gui::BnScreenCaptureListener>>()),
             status_t);

// Its results, which a listener of this process copies.

using Results = gui::ScreenCaptureResults;

class Listener : public gui::BnScreenCaptureListener {
    binder::Status onScreenCaptureCompleted(const Results&) override;
};
static_assert(std::is_base_of_v<RefBase, Listener>);
REQUIRE_TYPE(binder::Status::ok(), binder::Status);

static_assert(std::is_copy_constructible_v<Results>);
REQUIRE_TYPE(forms::statusOf(any<const Results>()), status_t);
REQUIRE_TYPE(Results::buffer, sp<GraphicBuffer>);
REQUIRE_TYPE(any<Fence>().waitForever(""), status_t);

// The pixels.

REQUIRE_TYPE(any<const GraphicBuffer>().getWidth(), uint32_t);
REQUIRE_TYPE(any<const GraphicBuffer>().getHeight(), uint32_t);
REQUIRE_TYPE(any<const GraphicBuffer>().getStride(), uint32_t);
REQUIRE_TYPE(any<const GraphicBuffer>().getPixelFormat(), PixelFormat);
REQUIRE_TYPE(any<GraphicBuffer>().lock(GRALLOC_USAGE_SW_READ_OFTEN, std::declval<void**>()),
             status_t);
REQUIRE_TYPE(any<GraphicBuffer>().unlock(), status_t);
static_assert(GRALLOC_USAGE_SW_READ_OFTEN == 3);
static_assert(std::is_same_v<PixelFormat, int32_t>);
REQUIRE_TYPE(bytesPerPixel(PixelFormat()), uint32_t);

// Sensor events: one layout on 32 and 64 bits.

static_assert(sizeof(sensors_event_t) == 104);
static_assert(offsetof(sensors_event_t, type) == 8);
static_assert(offsetof(sensors_event_t, timestamp) == 16);
static_assert(offsetof(sensors_event_t, data) == 24);
REQUIRE_TYPE(sensors_event_t::type, int32_t);
REQUIRE_TYPE(sensors_event_t::timestamp, int64_t);
REQUIRE_TYPE(sensors_event_t::data, float[16]);

// Properties. Not by address: the device's compiler judges each call.

static_assert(PROP_VALUE_MAX == 92);
REQUIRE_TYPE(property_get("name", std::declval<char*>(), "default"), int);
REQUIRE_TYPE(property_set("name", "value"), int);

// The log.

REQUIRE_TYPE(__android_log_print(ANDROID_LOG_DEBUG, "tag", "%d", 0), int);
static_assert(ANDROID_LOG_DEBUG == 3 && ANDROID_LOG_INFO == 4 && ANDROID_LOG_ERROR == 6);

// Clocks and errors.

static_assert(std::is_same_v<nsecs_t, int64_t>);
static_assert(std::is_same_v<status_t, int32_t>);
static_assert(OK == 0);
REQUIRE_TYPE(systemTime(SYSTEM_TIME_MONOTONIC), nsecs_t);
REQUIRE_TYPE(elapsedRealtimeNano(), int64_t);

// The worker's loop. Raw pointers become counted ones by themselves.

static_assert(std::is_base_of_v<RefBase, Looper>);
static_assert(std::is_convertible_v<Looper*, sp<Looper>>);
REQUIRE_TYPE(new Looper(/*allowNonCallbacks=*/false), Looper*);
REQUIRE_TYPE(any<Looper>().pollOnce(-1), int);
REQUIRE_TYPE(any<Looper>().wake(), void);
REQUIRE_TYPE(any<Looper>().sendMessage(any<sp<MessageHandler>>(), Message(1)), void);
REQUIRE_TYPE(any<Looper>().sendMessageDelayed(nsecs_t(), any<sp<MessageHandler>>(), Message(1)),
             void);
REQUIRE_TYPE(any<Looper>().removeMessages(any<sp<MessageHandler>>(), 1), void);
REQUIRE_TYPE(any<Looper>().removeMessages(any<sp<MessageHandler>>()), void);
REQUIRE_TYPE(Message::what, int);

class Handler : public MessageHandler {
    void handleMessage(const Message& message) override;
};
static_assert(std::is_convertible_v<sp<Handler>, sp<MessageHandler>>);
REQUIRE_TYPE(any<const Handler>().incStrong(nullptr), void);

// Its thread: what a subclass overrides, and what it calls.

class Worker : public Thread {
    using Thread::Thread;
    bool threadLoop() override {
        REQUIRE_TYPE(std::as_const(*this).exitPending(), bool);
        return false;
    }
};
static_assert(std::is_constructible_v<Worker, /*canCallJava*/ bool>);
REQUIRE_TYPE(any<Worker>().run("name"), status_t);
REQUIRE_TYPE(any<Worker>().requestExit(), void);

// Locks, texts and lists.

static_assert(std::is_default_constructible_v<Mutex> && !std::is_copy_constructible_v<Mutex>);
static_assert(std::is_constructible_v<Mutex::Autolock, Mutex&>);
REQUIRE_TYPE(any<Mutex>().lock(), status_t);
REQUIRE_TYPE(any<Mutex>().unlock(), void);
#ifndef GUARDED_BY
#error "utils/Mutex.h has no annotations for the analysis of thread safety"
#endif

static_assert(std::is_constructible_v<String8, const char*>);
REQUIRE_TYPE(any<const String8>().c_str(), const char*);

static_assert(std::is_default_constructible_v<Vector<int>>);
REQUIRE_TYPE(any<const Vector<int>>().size(), size_t);
REQUIRE_TYPE(any<const Vector<int>>().isEmpty(), bool);
REQUIRE_TYPE(any<const Vector<int>>()[0], const int&);
REQUIRE_TYPE(any<Vector<String8>>().push_back(any<const String8>()), void);

}  // namespace
}  // namespace android
