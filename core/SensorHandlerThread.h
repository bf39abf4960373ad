#pragma once

#include <utils/Looper.h>
#include <utils/Mutex.h>
#include <utils/RefBase.h>
#include <utils/String8.h>
#include <utils/Thread.h>

#include "core/Export.h"

namespace android {

/**
 * The library's one worker thread, "sensor_native_handler". The statistics modules do their slow
 * work on it: they post message codes, and the worker runs their handlers, one message at a time.
 * Messages run in order of their due times, those due at the same time in order of posting.
 *
 * Any thread may call any operation, the worker included. The Looper's own lock orders them. No
 * operation reports an error.
 *
 * How a module uses it:
 *  - It nests a `MessageHandler` without state, creates it in its constructor and keeps an `sp`.
 *  - The handler switches on `message.what` and calls a member of `getInstance()`. It ignores codes
 *    that it does not know.
 *  - To keep at most one message of a code pending, the module removes the code before posting it.
 */
class SENSOR_PRIV_EXPORT SensorHandlerThread : public Thread {
public:
    /** The single instance. The first call creates it and starts the thread. Locks `sLock`. */
    static SensorHandlerThread* getInstance();

    /**
     * Starts the thread with the default stack size. If no thread can be created, the log gets an
     * error, messages queue up undelivered, and the object is never destroyed.
     */
    SensorHandlerThread(const char* name, int priority);

    /** Quits. Does not wait for the thread. */
    ~SensorHandlerThread() override;

    /** Posts `what`, due now. */
    void sendMessage(const sp<MessageHandler>& handler, int what);

    /** Posts `what`, due in `delayMs` monotonic milliseconds. A negative delay is due now. */
    void sendMessageDelayed(const sp<MessageHandler>& handler, int what, int delayMs);

    /** Drops the handler's pending messages with the code `what`, delayed ones too. */
    void removeMessage(const sp<MessageHandler>& handler, int what);

    /** Drops all pending messages of the handler. */
    void removeAllMessages(const sp<MessageHandler>& handler);

    /** Runs messages until `quit()` or `requestExit()`. Returns false. */
    bool threadLoop() override;

    /** Ends the loop after what is due now. No later message is delivered. Safe to call twice. */
    void quit();

private:
    // Constant after construction.
    const sp<Looper> mLooper;
    String8 mText;  // part of the class's layout; always empty

    // Written by the threads that quit and read by the worker, without a lock.
    bool mQuit;

    static Mutex sLock;
    static SensorHandlerThread* mHandlerThread GUARDED_BY(sLock);
};

}  // namespace android
