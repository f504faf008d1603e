/// MKBitmapSaveManager: saves GPU bitmaps to files, counts the saves in flight, and hands each result to the
/// thread that created the manager, or to a thread that waits for it.
/// Owner:   the caller. Create it on a thread with a MessageLoop; without one, results come only to those who
///          wait.
/// Thread:  requests, waits and the count from any. Results are handed over on the message loop's thread or
///          on a waiting one, one at a time, with the manager's lock held: they may request further saves,
///          but neither wait for the manager nor destroy it.
/// Destroy: from any thread. Saves in flight still write their files; results not yet handed over are
///          dropped.
/// Fails:   see RequestSave. The event loop of the loader must be running
///          (MKBitmapLoader::startEventLoopBySelf).
#pragma once

#include "moka/base/ConditionalVariable.h"
#include "moka/base/CriticalSection.h"
#include "moka/base/Export.h"
#include "moka/base/NonAssignable.h"
#include "moka/base/String.h"

#include <atomic>
#include <list>
#include <memory>

namespace Moka {

class Handler;
class IGLMsgQueue;
class IMKBitmap;
class MKBitmapLoader;

class MOKA_API MKBitmapSaveManager : NonAssignable {
public:
    /// Copied with each request. Either function may be null.
    struct SaveCallback {
        /// The results of a save; context and userData are passed to both.
        void (*onSaveSucceeded)(void* context, String const* path, void* userData) = nullptr;
        void (*onSaveFailed)(void* context, String const* path, void* userData) = nullptr;
        void* context = nullptr;
        void* userData = nullptr;
    };

    MKBitmapSaveManager();
    virtual ~MKBitmapSaveManager();

    /// callback may be null; the save counts all the same. False for an empty bitmap and when memory runs
    /// out; a refused request stays counted, and waiting for the manager then never ends. So does a save
    /// whose read-back the bitmap's queue refuses.
    bool RequestSave(int id, String const& path, IMKBitmap& bitmap, SaveCallback* callback,
                     int quality) const;

    /// Saves requested whose result has not been handed over.
    int GetRequestSaveCount() const { return mSaveCount; }

    /// Hands over results on the calling thread until none is missing. queue is the one of the bitmaps, or
    /// null. Never on the render thread or the loader's.
    void WaitForSaveCompleting(IGLMsgQueue* queue);

private:
    struct Save {
        SaveCallback callback;
        String path;
        bool hasError = false;
    };
    using SaveList = std::list<Save>;

    static void sm_HandleMessage(Handler* handler, void* manager, int what);
    void OnSave(void* save, bool hasError);
    Save* AddSave(String const& path, SaveCallback const* callback) const;
    static void Dispatch(Save const& save);

    // A save goes from one list to the other without an allocation: once accepted, its result always arrives.
    std::atomic<int> mutable mSaveCount{0};
    ConditionalVariable mCondition; // a result arrived
    CriticalSection mutable mLock{true};
    SaveList mutable mRequested;
    SaveList mResults;                       // in the order of arrival
    std::unique_ptr<Handler> mHandler;       // null without a message loop
    std::unique_ptr<MKBitmapLoader> mLoader; // goes first: what it still calls needs the rest
};

} // namespace Moka
