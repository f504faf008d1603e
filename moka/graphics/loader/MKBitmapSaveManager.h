/// MKBitmapSaveManager: saves GPU bitmaps to files, counts unfinished saves, and reports each result on the
/// thread that created the manager, or on a thread that waits.
/// Owner:   the caller. Create it on a thread with a MessageLoop. Without one, results are reported only to
///          threads in WaitForSaveCompleting.
/// Thread:  requests, waits and the count on any thread. The callbacks run on the message loop's thread or on
///          a waiting one, one at a time, with the manager's lock held. They may request further saves, but
///          must not wait for the manager or destroy it.
/// Destroy: on any thread. Unfinished saves still write their files. Results that were not reported are
/// dropped.
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
    /// The callbacks of a save. Each request copies it. Each function may be null.
    struct SaveCallback {
        /// Called when the save succeeded or failed, with context and userData.
        void (*onSaveSucceeded)(void* context, String const* path, void* userData) = nullptr;
        void (*onSaveFailed)(void* context, String const* path, void* userData) = nullptr;
        void* context = nullptr;
        void* userData = nullptr;
    };

    MKBitmapSaveManager();
    virtual ~MKBitmapSaveManager();

    /// Requests a save. callback may be null; the save is counted nevertheless. Returns false if the bitmap
    /// is empty or memory runs out. A refused request stays counted, and so does a save whose read-back the
    /// bitmap's queue refuses; WaitForSaveCompleting then never returns.
    bool RequestSave(int id, String const& path, IMKBitmap& bitmap, SaveCallback* callback,
                     int quality) const;

    /// The number of saves whose results have not been reported.
    int GetRequestSaveCount() const { return mSaveCount; }

    /// Waits for all results and reports them on the calling thread. queue is that of the bitmaps, or null.
    /// Do not call it on the render thread or the loader's thread.
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

    // A save moves from one list to the other without an allocation, so the result of an accepted save always
    // arrives.
    std::atomic<int> mutable mSaveCount{0};
    ConditionalVariable mCondition; // a result arrived
    CriticalSection mutable mLock{true};
    SaveList mutable mRequested;
    SaveList mResults;                       // in the order of arrival
    std::unique_ptr<Handler> mHandler;       // null without a message loop
    std::unique_ptr<MKBitmapLoader> mLoader; // destroyed first: its callbacks use the other members
};

} // namespace Moka
