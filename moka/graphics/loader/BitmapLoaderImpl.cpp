#include "moka/graphics/loader/BitmapLoaderImpl.h"

#include "moka/base/Check.h"
#include "moka/base/Thread.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/loader/LoaderLog.h"

#include <new>

namespace Moka::detail {
namespace {

// Above the priority of user interface threads, because they wait for the images.
constexpr int kThreadPriority = -9;

std::size_t GetBufferSize(IMKBitmap const& bitmap) {
    if (bitmap.GetWidth() < 1 || bitmap.GetHeight() < 1) return 0;
    return static_cast<std::size_t>(bitmap.GetWidth()) * static_cast<std::size_t>(bitmap.GetHeight()) * 4;
}

// Cleared, because a bitmap of a region does not write the rest of its rectangle, and old memory must not get
// into a file.
unsigned char* AllocateCleared(std::size_t size) {
    return size > 0 ? new (std::nothrow) unsigned char[size]() : nullptr;
}

} // namespace

BitmapLoaderImpl& BitmapLoaderImpl::GetInstance() {
    static BitmapLoaderImpl instance;
    return instance;
}

// At process exit the loop may still wait on the conditions or process a request. So only the queue is
// destroyed.
BitmapLoaderImpl::~BitmapLoaderImpl() {
    AutoCriticalSection const lock(*mLock);
    mQueue.reset();
}

bool BitmapLoaderImpl::RequestLoad(BitmapLoaderInterface* listener, int id, String const& path,
                                   BitmapType type, IGLMsgQueue* queue, int width, int height) {
    if (!listener) return false;
    AutoCriticalSection const lock(*mLock);
    if (!mQueue || mQueue->HasLoad(listener, id)) return false;
    RequestList load = MakeRequest(REQUEST_LOAD, listener, id, path);
    if (load.empty()) return false;
    load.front().bitmapType = type;
    load.front().msgQueue = queue;
    load.front().loadWidth = width;
    load.front().loadHeight = height;
    return AddRequest(load);
}

bool BitmapLoaderImpl::RequestSave(BitmapLoaderInterface* listener, int id, String const& path,
                                   IMKBitmap& bitmap, void* userData, int quality) {
    RequestList save = MakeRequest(REQUEST_SAVE, listener, id, path);
    if (save.empty()) return false;
    Request& request = save.front();
    request.buffer.reset(AllocateCleared(GetBufferSize(bitmap)));
    if (!request.buffer) return false;
    request.width = bitmap.GetWidth();
    request.height = bitmap.GetHeight();
    request.userData = userData;
    request.quality = quality;

    AutoCriticalSection const lock(*mLock);
    mPendingSaveRequestList->splice(mPendingSaveRequestList->end(), save);
    // If this runs on the render thread, the callback may run, and delete the request, before the call
    // returns.
    bitmap.GetBitmapDataAsync(Rect(0, 0, request.width, request.height), request.buffer.get(), &request,
                              SaveBitmapCB);
    return true;
}

bool BitmapLoaderImpl::RequestSave(BitmapLoaderInterface* listener, int id, String const& path,
                                   unsigned char* buffer, int width, int height, void* userData,
                                   int quality) {
    if (!buffer) return false;
    RequestList save = MakeRequest(REQUEST_SAVE, listener, id, path);
    if (save.empty()) return false;
    Request& request = save.front();
    request.buffer.reset(buffer);
    request.width = width;
    request.height = height;
    request.userData = userData;
    request.quality = quality;
    if (AddRequest(save)) return true;
    static_cast<void>(request.buffer.release());
    return false;
}

// Runs on the render thread.
void BitmapLoaderImpl::SaveBitmapCB(Rect const&, void*, void* request) {
    BitmapLoaderImpl& self = GetInstance();
    AutoCriticalSection const lock(*self.mLock);
    RequestList save = TakeRequest(*self.mPendingSaveRequestList, request);
    if (!save.empty()) self.AddRequest(save);
}

bool BitmapLoaderImpl::AddRequest(RequestList& request) {
    AutoCriticalSection const lock(*mLock);
    int const serial = static_cast<int>(mRequestCount);
    request.front().serial = serial;
    if (!mQueue || !mQueue->Append(request)) return false;
    ++mRequestCount;
    LogInfo("BitmapLoaderImpl::AddRequest; queue size(%d) request[%d]", GetQueueSize(), serial);
    mQueueCondition->Signal();
    return true;
}

void BitmapLoaderImpl::CancelLoadRequest(BitmapLoaderInterface* listener, int id) {
    AutoCriticalSection const lock(*mLock);
    RequestList const load = mQueue ? mQueue->TakeLoad(listener, id) : RequestList();
    if (load.empty()) {
        LogInfo("BitmapLoaderImpl::CancelRequest; queue size(%d) no request", GetQueueSize());
    } else {
        LogInfo("BitmapLoaderImpl::CancelRequest; queue size(%d) request[%d]", GetQueueSize(),
                load.front().serial);
    }
}

void BitmapLoaderImpl::CancelAllLoadRequest(BitmapLoaderInterface* listener) {
    AutoCriticalSection const lock(*mLock);
    if (GetQueueSize() == 0) return;
    mQueue->RemoveAllLoads(listener);
    LogInfo("BitmapLoaderImpl::CancelAllRequest; queue size(%d)", GetQueueSize());
}

void BitmapLoaderImpl::RemoveAllSaveCallback(BitmapLoaderInterface* listener) {
    AutoCriticalSection const lock(*mLock);
    if (mQueue) mQueue->ClearSaveListener(listener);
    ClearSaveListener(*mPendingSaveRequestList, listener);
}

void BitmapLoaderImpl::WaitUntilMsgQueueRequired() {
    AutoCriticalSection const lock(*mLock);
    while (mLoadTaskRunning) {
        MOKA_CHECK(!IsLoaderThread(), "a callback of the loader waits for the loader, which waits for it");
        LogInfo("%s - LoadTaskRunning -> Start Wait", "WaitUntilMsgQueueRequired");
        mLoadDoneCondition->Wait(*mLock);
        LogInfo("%s - LoadTaskRunning -> End Wait", "WaitUntilMsgQueueRequired");
    }
}

void BitmapLoaderImpl::WaitForAllSaveRequestsToEnd() {
    AutoCriticalSection const lock(*mLock);
    while (!mPendingSaveRequestList->empty() || GetQueueSize() > 0 || mSaveTaskRunning) {
        MOKA_CHECK(!IsLoaderThread(), "a callback of the loader waits for the loader, which waits for it");
        LogInfo("%s - SaveTaskRunning -> Start Wait, mPendingSaveRequestList->GetCount() = %d, "
                "mQueue->GetCount() = %d, mSaveTaskRunning = %d",
                "WaitForAllSaveRequestsToEnd", static_cast<int>(mPendingSaveRequestList->size()),
                GetQueueSize(), static_cast<int>(mSaveTaskRunning));
        mSaveDoneCondition->Wait(*mLock);
        LogInfo("%s - SaveTaskRunning -> End Wait", "WaitForAllSaveRequestsToEnd");
    }
}

bool BitmapLoaderImpl::EventLoopBySelf(void* loader) {
    auto& self = *static_cast<BitmapLoaderImpl*>(loader);
    AutoCriticalSection const lock(*self.mLock);
    if (self.mThread) return true;
    std::unique_ptr<Thread> thread(new (std::nothrow)
                                       Thread(EventLoop, loader, "MokaBitmapLoader thread", kThreadPriority));
    if (!thread || !thread->Start()) return false;
    self.mThread = thread.release();
    return true;
}

} // namespace Moka::detail
