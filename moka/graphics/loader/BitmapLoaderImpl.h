// BitmapLoaderImpl: the common part of all loaders: one queue of requests, and a loop that decodes and
// encodes them one after the other on its own thread.
// Owner:   one static object for the process. At process exit queued requests are dropped; the loop's thread
//          is not joined.
// Thread:  requests, cancels and waits on any thread except the loop's, which would wait for itself.
//          Callbacks run on the loop's thread.
// Locks:   one recursive lock guards everything. It is held while tasks are posted, and a task on the render
// thread
//          locks it. A listener's lock is locked inside it. So a queue must not hold its own lock while it
//          runs or frees a task, and nobody may call the loader while holding a listener's lock.
// Fails:   refuses requests if memory runs out; nothing throws.
#pragma once

#include "moka/base/ConditionalVariable.h"
#include "moka/base/CriticalSection.h"
#include "moka/base/NonAssignable.h"
#include "moka/graphics/loader/NeverDestroyed.h"
#include "moka/graphics/loader/RequestQueue.h"

#include <memory>
#include <optional>

namespace Moka {

class Bitmap;
class IMKBitmap;
class Rect;
class Thread;

namespace detail {

class BitmapLoaderImpl : NonAssignable {
public:
    static BitmapLoaderImpl& GetInstance();

    // Returns false if memory runs out, if listener is null, or while a load of this listener and id is
    // queued or processed.
    bool RequestLoad(BitmapLoaderInterface* listener, int id, String const& path, BitmapType type,
                     IGLMsgQueue* queue, int width, int height);

    // Reads the bitmap back first. If the bitmap's queue refuses that, the request stays pending for ever.
    // Returns false if memory runs out or the bitmap is empty.
    bool RequestSave(BitmapLoaderInterface* listener, int id, String const& path, IMKBitmap& bitmap,
                     void* userData, int quality);
    // Takes ownership of the pixels: RGBA8, rows packed, from `new unsigned char[]`. Returns false, and does
    // not take ownership, if memory runs out or buffer is null.
    bool RequestSave(BitmapLoaderInterface* listener, int id, String const& path, unsigned char* buffer,
                     int width, int height, void* userData, int quality);

    // Cancel loads, including one that is being decoded: its result is dropped, and nobody is called.
    void CancelLoadRequest(BitmapLoaderInterface* listener, int id);
    void CancelAllLoadRequest(BitmapLoaderInterface* listener);
    // Makes queued and pending saves of this listener call nobody. They still write their files.
    void RemoveAllSaveCallback(BitmapLoaderInterface* listener);

    // Waits while a load is being processed, including its callbacks.
    void WaitUntilMsgQueueRequired();
    // Waits while a save is being read back or processed, or any request is queued.
    void WaitForAllSaveRequestsToEnd();

    // Runs the loop on the calling thread. Do not start a second loop, here or with EventLoopBySelf: this is
    // not checked, and each request would be processed twice.
    [[noreturn]] static void EventLoop(void* loader);
    // Starts the loop on a thread of the loader, once. Returns false if the system cannot create a thread.
    static bool EventLoopBySelf(void* loader);

    // True on the thread that calls back. Waiting for the loader on that thread would never end.
    static bool IsLoaderThread();

private:
    BitmapLoaderImpl() = default;
    ~BitmapLoaderImpl();

    static void SaveBitmapCB(Rect const& rect, void* buffer, void* request);

    bool AddRequest(RequestList& request);
    int GetQueueSize() const { return mQueue ? mQueue->GetCount() : 0; }

    Request AwaitRequest();
    void Process(Request& request);
    void LoadBitmap(Request& request);
    void SaveBitmap(Request& request);
    void ConfirmLoad(Request& request);
    void ConfirmSave(Request& request);

    NeverDestroyed<CriticalSection> mLock{true};
    NeverDestroyed<ConditionalVariable> mQueueCondition;    // a request was queued
    NeverDestroyed<ConditionalVariable> mLoadDoneCondition; // a load was processed
    NeverDestroyed<ConditionalVariable> mSaveDoneCondition; // a save was processed, or the queue is empty
    std::optional<RequestQueue> mQueue{std::in_place};      // empty after the destructor
    NeverDestroyed<RequestList> mPendingSaveRequestList;    // saves whose pixels are being read back
    Thread* mThread = nullptr;                              // never deleted
    unsigned mRequestCount = 0;
    bool mLoadTaskRunning = false;
    bool mSaveTaskRunning = false;
};

} // namespace detail
} // namespace Moka
