#pragma once

#include <utils/Looper.h>
#include <utils/Mutex.h>
#include <utils/RefBase.h>
#include <utils/String8.h>
#include <utils/Thread.h>

#include "core/Export.h"

namespace android {

/**
 * The library's one worker thread, "sensor_native_handler". Every statistics module does its slow
 * work there: it posts small message codes to its own `MessageHandler`, whose `handleMessage` then
 * runs on the worker, one message at a time, in the order of due times and, for equal due times, in
 * the order of posting.
 *
 * All operations may be called from any thread, the worker included. None reports an error, none
 * takes a lock of this class; the Looper's own lock orders them. Each wakes the loop first and then
 * changes the queue.
 *
 * How a module uses it:
 *  - it nests a handler class without state, created in its constructor and kept in a member `sp`;
 *  - the handler switches on `message.what`, fetches the module by `getInstance()` and calls one of
 *    its members; codes that it does not know are ignored;
 *  - a code that must be pending at most once is removed before it is posted again.
 */
class SENSOR_PRIV_EXPORT SensorHandlerThread : public Thread {
public:
    /** The single instance; the first call creates it and so starts the thread. Locks `sLock`. */
    static SensorHandlerThread* getInstance();

    /**
     * Starts the thread at once, with that name and priority and the default stack size. If the
     * thread cannot be created, an error goes to the log, messages queue up and are never
     * delivered, and the object is never destroyed.
     */
    SensorHandlerThread(const char* name, int priority);

    /** Ends the loop as `quit()` does; does not wait for the thread. */
    ~SensorHandlerThread() override;

    /** Posts `what`, due now. */
    void sendMessage(const sp<MessageHandler>& handler, int what);

    /** Posts `what`, due in `delayMs` milliseconds of the monotonic clock; at once if negative. */
    void sendMessageDelayed(const sp<MessageHandler>& handler, int what, int delayMs);

    /** Drops every pending `what` of `handler`, delayed ones included, and nothing else. */
    void removeMessage(const sp<MessageHandler>& handler, int what);

    /** Drops every pending message of `handler`; those of other handlers stay. */
    void removeAllMessages(const sp<MessageHandler>& handler);

    /** Runs messages until `quit()` or `requestExit()`; always returns false. */
    bool threadLoop() override;

    /**
     * Lets the loop end after what is due now. Messages that are still queued, or posted later, are
     * never delivered. A second call does nothing.
     */
    void quit();

private:
    // Constant after construction.
    const sp<Looper> mLooper;
    String8 mText;  // part of the class's layout; always empty

    // Written by the quitting thread and read by the worker after a wake, without a lock.
    bool mQuit;

    static Mutex sLock;
    static SensorHandlerThread* mHandlerThread GUARDED_BY(sLock);
};

}  // namespace android
