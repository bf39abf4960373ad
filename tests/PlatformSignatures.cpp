/**
 * All that the library asks of the platform's headers, as assertions for the compiler. They hold
 * for platform versions 12, 12L and 13, on 32 and 64 bits; on another version, the ones that fail
 * say what a port has to replace. The file defines nothing.
 *
 * In a platform tree, let the library's module compile it once:
 *     sed -i 's|"usage/\*.cpp",|& "tests/PlatformSignatures.cpp",|' Android.bp && m libsensor-priv
 *
 * By itself, from the project's folder, with one -isystem for each folder of platform headers:
 *     clang++-14 -std=c++17 -fsyntax-only -isystem platform/include -isystem /usr/include/android \
 *         tests/PlatformSignatures.cpp
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

/** `function`, of its overloads the one of the type behind it, is there. */
#define REQUIRE_FUNCTION(function, ...) \
    static_assert(sizeof(static_cast<__VA_ARGS__>(&function)) != 0, #function)

/** `expression`, or the member `expression`, has exactly that type. */
#define REQUIRE_TYPE(expression, ...) \
    static_assert(std::is_same_v<decltype(expression), __VA_ARGS__>, #expression)

namespace android {
namespace {

// The display's token. The unqualified names live in android::gui at 13.

REQUIRE_FUNCTION(SurfaceComposerClient::getInternalDisplayToken, sp<IBinder> (*)());
static_assert(std::is_base_of_v<RefBase, IBinder>);
static_assert(!std::is_destructible_v<IBinder>, "its destructor is protected");

// The request of a capture.

REQUIRE_FUNCTION(ScreenshotClient::captureDisplay,
                 status_t (*)(const DisplayCaptureArgs&, const sp<IScreenCaptureListener>&));
static_assert(std::is_default_constructible_v<DisplayCaptureArgs>);
static_assert(std::has_virtual_destructor_v<DisplayCaptureArgs>);
REQUIRE_TYPE(DisplayCaptureArgs::pixelFormat, ui::PixelFormat);
REQUIRE_TYPE(DisplayCaptureArgs::sourceCrop, Rect);
REQUIRE_TYPE(DisplayCaptureArgs::frameScaleX, float);
REQUIRE_TYPE(DisplayCaptureArgs::frameScaleY, float);
REQUIRE_TYPE(DisplayCaptureArgs::captureSecureLayers, bool);
REQUIRE_TYPE(DisplayCaptureArgs::displayToken, sp<IBinder>);
REQUIRE_TYPE(DisplayCaptureArgs::width, uint32_t);
REQUIRE_TYPE(DisplayCaptureArgs::height, uint32_t);
REQUIRE_TYPE(DisplayCaptureArgs::useIdentityTransform, bool);

static_assert(std::is_constructible_v<Rect, int32_t, int32_t, int32_t, int32_t>);
static_assert(std::is_default_constructible_v<Rect>);
REQUIRE_TYPE(Rect::left, int32_t);
REQUIRE_TYPE(Rect::top, int32_t);
REQUIRE_TYPE(Rect::right, int32_t);
REQUIRE_TYPE(Rect::bottom, int32_t);
REQUIRE_FUNCTION(Rect::getWidth, int32_t (Rect::*)() const);
REQUIRE_FUNCTION(Rect::getHeight, int32_t (Rect::*)() const);
REQUIRE_FUNCTION(Rect::isValid, bool (Rect::*)() const);
REQUIRE_FUNCTION(Rect::isEmpty, bool (Rect::*)() const);

/** Whether `Enum` has a scope of its own and 32 bits. */
template <typename Enum>
constexpr bool isScoped() {
    return std::is_enum_v<Enum> && !std::is_convertible_v<Enum, int32_t> &&
           std::is_same_v<std::underlying_type_t<Enum>, int32_t>;
}
static_assert(isScoped<ui::PixelFormat>());
static_assert(isScoped<ui::Dataspace>());
static_assert(static_cast<int32_t>(ui::PixelFormat::RGBA_8888) == 1);
static_assert(static_cast<int32_t>(ui::Dataspace::UNKNOWN) == 0);
static_assert(static_cast<int32_t>(ui::Dataspace::V0_SRGB) == 142671872);

// Its results, which a listener of this process copies.

static_assert(std::is_same_v<IScreenCaptureListener, gui::IScreenCaptureListener>);
static_assert(std::is_base_of_v<gui::IScreenCaptureListener, gui::BnScreenCaptureListener>);
static_assert(std::is_base_of_v<RefBase, gui::IScreenCaptureListener>);
static_assert(std::is_abstract_v<gui::BnScreenCaptureListener>);
REQUIRE_FUNCTION(gui::IScreenCaptureListener::onScreenCaptureCompleted,
                 binder::Status (gui::IScreenCaptureListener::*)(const gui::ScreenCaptureResults&));
REQUIRE_FUNCTION(binder::Status::ok, binder::Status (*)());
REQUIRE_FUNCTION(binder::Status::isOk, bool (binder::Status::*)() const);
static_assert(std::is_final_v<binder::Status>);

static_assert(std::is_copy_constructible_v<gui::ScreenCaptureResults>);
static_assert(std::has_virtual_destructor_v<gui::ScreenCaptureResults>);
REQUIRE_TYPE(gui::ScreenCaptureResults::buffer, sp<GraphicBuffer>);
REQUIRE_TYPE(gui::ScreenCaptureResults::fence, sp<Fence>);
REQUIRE_TYPE(gui::ScreenCaptureResults::capturedSecureLayers, bool);
REQUIRE_TYPE(gui::ScreenCaptureResults::capturedDataspace, ui::Dataspace);
REQUIRE_TYPE(gui::ScreenCaptureResults::result, status_t);

static_assert(std::is_base_of_v<LightRefBase<Fence>, Fence>);
static_assert(!std::is_destructible_v<Fence>, "its destructor is private");
static_assert(!std::is_copy_assignable_v<Fence>);
REQUIRE_TYPE(Fence::NO_FENCE, const sp<Fence>);
REQUIRE_FUNCTION(Fence::wait, status_t (Fence::*)(int));
REQUIRE_FUNCTION(Fence::waitForever, status_t (Fence::*)(const char*));
REQUIRE_FUNCTION(Fence::isValid, bool (Fence::*)() const);

// The pixels.

static_assert(!std::is_destructible_v<GraphicBuffer>, "its destructor is private");
REQUIRE_FUNCTION(GraphicBuffer::getWidth, uint32_t (GraphicBuffer::*)() const);
REQUIRE_FUNCTION(GraphicBuffer::getHeight, uint32_t (GraphicBuffer::*)() const);
REQUIRE_FUNCTION(GraphicBuffer::getStride, uint32_t (GraphicBuffer::*)() const);
REQUIRE_FUNCTION(GraphicBuffer::getPixelFormat, PixelFormat (GraphicBuffer::*)() const);
REQUIRE_FUNCTION(GraphicBuffer::lock,
                 status_t (GraphicBuffer::*)(uint32_t, void**, int32_t*, int32_t*));
REQUIRE_FUNCTION(GraphicBuffer::unlock, status_t (GraphicBuffer::*)());
// The last two parameters have defaults.
REQUIRE_TYPE(std::declval<GraphicBuffer&>().lock(GRALLOC_USAGE_SW_READ_OFTEN,
                                                 std::declval<void**>()),
             status_t);
static_assert(GRALLOC_USAGE_SW_READ_OFTEN == 3);
static_assert(std::is_same_v<PixelFormat, int32_t>);
REQUIRE_FUNCTION(bytesPerPixel, uint32_t (*)(PixelFormat));

// Sensor events: one layout on 32 and 64 bits.

static_assert(sizeof(sensors_event_t) == 104);
static_assert(offsetof(sensors_event_t, version) == 0);
static_assert(offsetof(sensors_event_t, sensor) == 4);
static_assert(offsetof(sensors_event_t, type) == 8);
static_assert(offsetof(sensors_event_t, reserved0) == 12);
static_assert(offsetof(sensors_event_t, timestamp) == 16);
static_assert(offsetof(sensors_event_t, data) == 24);
static_assert(offsetof(sensors_event_t, u64) == 24);
static_assert(offsetof(sensors_event_t, flags) == 88);
static_assert(offsetof(sensors_event_t, reserved1) == 92);
REQUIRE_TYPE(sensors_event_t::type, int32_t);
REQUIRE_TYPE(sensors_event_t::timestamp, int64_t);
REQUIRE_TYPE(sensors_event_t::data, float[16]);
REQUIRE_TYPE(sensors_event_t::u64.data, uint64_t[8]);
REQUIRE_TYPE(sensors_event_t::flags, uint32_t);

// Properties. Not by address: the device's compiler judges each call.

static_assert(PROP_VALUE_MAX == 92);
static_assert(PROPERTY_VALUE_MAX == PROP_VALUE_MAX);
static_assert(PROP_NAME_MAX == 32);
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
REQUIRE_FUNCTION(Looper::pollOnce, int (Looper::*)(int));
REQUIRE_FUNCTION(Looper::wake, void (Looper::*)());
REQUIRE_FUNCTION(Looper::sendMessage, void (Looper::*)(const sp<MessageHandler>&, const Message&));
REQUIRE_FUNCTION(Looper::sendMessageDelayed,
                 void (Looper::*)(nsecs_t, const sp<MessageHandler>&, const Message&));
REQUIRE_FUNCTION(Looper::removeMessages, void (Looper::*)(const sp<MessageHandler>&, int));
REQUIRE_FUNCTION(Looper::removeMessages, void (Looper::*)(const sp<MessageHandler>&));
static_assert(std::is_constructible_v<Message, int>);
REQUIRE_TYPE(Message::what, int);

class Handler : public MessageHandler {
    void handleMessage(const Message&) override {}
};
static_assert(std::is_convertible_v<sp<Handler>, sp<MessageHandler>>);
REQUIRE_FUNCTION(RefBase::incStrong, void (RefBase::*)(const void*) const);

// Its thread: what a subclass overrides, and what it calls.

static_assert(std::has_virtual_destructor_v<Thread>);
REQUIRE_FUNCTION(Thread::run, status_t (Thread::*)(const char*, int32_t, size_t));
REQUIRE_FUNCTION(Thread::requestExit, void (Thread::*)());

class Worker : public Thread {
    using Thread::Thread;
    bool threadLoop() override {
        REQUIRE_TYPE(std::as_const(*this).exitPending(), bool);
        return false;
    }
};
static_assert(std::is_constructible_v<Worker, /*canCallJava*/ bool>);

// Locks, texts and lists.

static_assert(std::is_default_constructible_v<Mutex> && !std::is_copy_constructible_v<Mutex>);
static_assert(std::is_constructible_v<Mutex::Autolock, Mutex&>);
REQUIRE_FUNCTION(Mutex::lock, status_t (Mutex::*)());
REQUIRE_FUNCTION(Mutex::unlock, void (Mutex::*)());
#ifndef GUARDED_BY
#error "utils/Mutex.h has no annotations for the analysis of thread safety"
#endif

static_assert(std::is_constructible_v<String8, const char*>);
REQUIRE_FUNCTION(String8::string, const char* (String8::*)() const);

static_assert(std::is_default_constructible_v<Vector<int>>);
REQUIRE_FUNCTION(Vector<int>::size, size_t (Vector<int>::*)() const);
REQUIRE_FUNCTION(Vector<int>::isEmpty, bool (Vector<int>::*)() const);
REQUIRE_TYPE(std::declval<const Vector<int>&>()[0], const int&);
REQUIRE_TYPE(std::declval<Vector<String8>&>().push_back(std::declval<const String8&>()), void);

}  // namespace
}  // namespace android
