// BitmapLoaderImpl: the engine behind the loaders: one queue of requests and the loop that decodes and
// encodes them, one after the other, away from everybody's thread.
// Owner:   the process. Its end drops what is queued and lets the loop sleep on; nothing is joined.
// Thread:  requests, cancels and waits from any but the loop's own, which may not wait for itself. All
//          callbacks come on the loop's thread.
// Locks:   one recursive lock guards everything. It is held while tasks are posted and taken again inside a
//          render-thread task; a listener's lock is taken inside it. So: no queue may hold a lock of its own
//          while it runs or frees a task, and nobody calls the loader with a listener's lock held.
// Fails:   requests are refused when memory runs out; nothing throws.
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

    // False also for a null listener, and while a load of this listener and id is queued or processed.
    bool RequestLoad(BitmapLoaderInterface* listener, int id, String const& path, BitmapType type,
                     IGLMsgQueue* queue, int width, int height);

    // Reads the bitmap back first. A read-back that the bitmap's queue refuses stays pending for ever. False
    // also for an empty bitmap.
    bool RequestSave(BitmapLoaderInterface* listener, int id, String const& path, IMKBitmap& bitmap,
                     void* userData, int quality);
    // Owns the pixels from here on, unless it returns false: RGBA8, rows packed, `new unsigned char[]`. False
    // also for a null buffer.
    bool RequestSave(BitmapLoaderInterface* listener, int id, String const& path, unsigned char* buffer,
                     int width, int height, void* userData, int quality);

    // A load that is being decoded is cancelled too: its result is dropped, and nobody is called back.
    void CancelLoadRequest(BitmapLoaderInterface* listener, int id);
    void CancelAllLoadRequest(BitmapLoaderInterface* listener);
    // Saves of this listener, queued or being read back, still write their files but call nobody.
    void RemoveAllSaveCallback(BitmapLoaderInterface* listener);

    // While a load is being processed, its callbacks included.
    void WaitUntilMsgQueueRequired();
    // While a save is being read back, queued or processed, or anything else is queued.
    void WaitForAllSaveRequestsToEnd();

    // The loop, on the calling thread. The loader's own thread is the alternative: nothing keeps two loops
    // from running, but they would process each request twice.
    [[noreturn]] static void EventLoop(void* loader);
    // Starts the loop on a thread of the loader's own, once. False when there is no such thread to be had.
    static bool EventLoopBySelf(void* loader);

    // On the thread that calls back. Waiting for the loader there would never end.
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
    NeverDestroyed<ConditionalVariable> mSaveDoneCondition; // a save was, or the queue ran empty
    std::optional<RequestQueue> mQueue{std::in_place};      // nothing once the process ends
    NeverDestroyed<RequestList> mPendingSaveRequestList;    // their pixels are being read back
    Thread* mThread = nullptr;                              // never deleted
    unsigned mRequestCount = 0;
    bool mLoadTaskRunning = false;
    bool mSaveTaskRunning = false;
};

} // namespace detail
} // namespace Moka
