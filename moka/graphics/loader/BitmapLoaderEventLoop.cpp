// The part of BitmapLoaderImpl that runs on the loader's thread.
#include "moka/graphics/loader/BitmapLoaderImpl.h"

#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/RunGuarded.h"
#include "moka/base/Trace.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/factory/MKGraphicsFactory.h"
#include "moka/graphics/loader/BitmapLoaderInterface.h"
#include "moka/graphics/loader/LoaderLog.h"
#include "moka/graphics/loader/PathForLog.h"
#include "moka/graphics/task/WorkerTask.h"

#include <utility>

namespace Moka::detail {
namespace {

constexpr int kMaxLoggedPathBytes = 500;

thread_local bool isLoaderThread = false;

// Exceptions of codecs (out of memory) and of listeners must not end the loop.
template <class Function>
void Guard(char const* who, Function const& function) {
    RunGuarded(kLoaderTag, who, function);
}

// The base library decodes CPU loads on every platform.
Bitmap* DecodeForCpu(Request const& load) {
    if (load.loadWidth == 0 || load.loadHeight == 0)
        return BitmapFactory::CreateBitmapForGraphics(&load.path);
    return BitmapFactory::CreateBitmap(&load.path, load.loadWidth, load.loadHeight);
}

std::unique_ptr<Bitmap> Decode(Request const& load) {
    std::unique_ptr<Bitmap> bitmap;
    Guard("BitmapLoaderImpl::LoadBitmap decoding", [&] {
        bitmap.reset(load.bitmapType == BITMAP_TYPE_CPU ? DecodeForCpu(load)
                                                        : MKGraphicsFactory::CreateScaledCPUBitmap(
                                                              &load.path, load.loadWidth, load.loadHeight));
    });
    return bitmap;
}

// Creates the GPU bitmap, which takes ownership of the pixels if it could be created.
IMKBitmap* Upload(Request const& load, Bitmap* decoded) {
    constexpr char const* kWhat = "BitmapLoaderImpl::LoadBitmap (CreateScaledCPUBitmap)";
    if (!decoded) {
        __android_log_print(ANDROID_LOG_ERROR, kLoaderTag, "%s",
                            "BitmapLoaderImpl::LoadBitmap (CreateScaledCPUBitmap): bitmap is null");
        return nullptr;
    }
    decoded->SetDeleteBuffer(false);
    IMKBitmap* const bitmap = MKGraphicsFactory::CreateBitmap(
        load.msgQueue, decoded->GetWidth(), decoded->GetHeight(), decoded->GetBuffer(), true, 1, false);
    if (bitmap) {
        bitmap->SetTag(kWhat);
    } else {
        decoded->SetDeleteBuffer(true);
    }
    return bitmap;
}

void ReleaseResult(Bitmap*) {}
void ReleaseResult(IMKBitmap* bitmap) { MKGraphicsFactory::ReleaseBitmap(bitmap); }

// The closing log line says "OnLoad" if the file was decoded, even if the GPU bitmap could not be created.
// Log filters search for these lines.
template <class Result>
void Report(Request const& load, Result* result, bool wasDecoded) {
    if (!load.listener) return;
    auto const nameOf = [](bool loaded) { return loaded ? "OnLoad" : "OnLoadError"; };
    LogInfo("BitmapLoaderImpl::LoadBitmap Call %s.", nameOf(result != nullptr));
    Guard(nameOf(result != nullptr), [&] {
        if (result) {
            load.listener->OnLoad(load.id, load.path, *result);
        } else {
            load.listener->OnLoadError(load.id, load.path);
        }
    });
    ReleaseResult(result);
    Guard("OnCallbackCompleted", [&] { load.listener->OnCallbackCompleted(); });
    LogInfo("BitmapLoaderImpl::LoadBitmap Call %s finish.", nameOf(wasDecoded));
}

void Report(Request const& save, bool saved) {
    if (!save.listener) return;
    Guard(saved ? "OnSave" : "OnSaveError", [&] {
        if (saved) {
            save.listener->OnSave(save.id, save.path, save.userData);
        } else {
            save.listener->OnSaveError(save.id, save.path, save.userData);
        }
    });
    Guard("OnCallbackCompleted", [&] { save.listener->OnCallbackCompleted(); });
}

// Posts the deletion of the bitmap, because the listener may use it until the render thread has caught up. If
// the queue refuses, the bitmap stays alive for its receiver. Without a listener it is deleted here.
void Discard(Request const& load, std::unique_ptr<Bitmap> decoded) {
    if (!decoded) return;
    bool const isTaken = load.msgQueue && WorkerTask::PostDelete(load.msgQueue, decoded.get());
    if (isTaken || load.listener) static_cast<void>(decoded.release());
}

bool Encode(Request const& save) {
    // For a width above the limit, use a stride that is refused, because the product might overflow.
    int const stride = save.width <= BitmapFactory::kMaxSide ? save.width * 4 : 0;
    Bitmap bitmap;
    if (!bitmap.Construct(save.buffer.get(), save.width, save.height, stride, Bitmap::kFormatRgba8888, false,
                          false)) {
        LogInfo("BitmapLoaderImpl::SaveBitmap error bitmap construct fail");
    }
    bool isSaved = false;
    Guard("BitmapLoaderImpl::SaveBitmap encoding",
          [&] { isSaved = BitmapFactory::SaveBitmap(&bitmap, &save.path, save.quality); });
    return isSaved;
}

} // namespace

bool BitmapLoaderImpl::IsLoaderThread() { return isLoaderThread; }

void BitmapLoaderImpl::EventLoop(void* loader) {
    isLoaderThread = true;
    auto& self = *static_cast<BitmapLoaderImpl*>(loader);
    for (;;) {
        Request request = self.AwaitRequest();
        self.Process(request);
    }
}

// Waits for a request and returns its contents. The emptied head stays in the queue, to show that the request
// was not cancelled.
Request BitmapLoaderImpl::AwaitRequest() {
    AutoCriticalSection const lock(*mLock);
    while (GetQueueSize() == 0) {
        mSaveDoneCondition->Signal();
        LogInfo("BitmapLoaderImpl::EventLoop Wait!");
        mQueueCondition->Wait(*mLock);
    }
    LogInfo("BitmapLoaderImpl::EventLoop queue size(%d)", GetQueueSize());
    Request request = std::move(*mQueue->GetHead());
    (request.type == REQUEST_SAVE ? mSaveTaskRunning : mLoadTaskRunning) = true;
    return request;
}

void BitmapLoaderImpl::Process(Request& request) {
    PathForLog<kMaxLoggedPathBytes> const path(request.path);
    TraceScope const trace("loader", request.type == REQUEST_LOAD ? "load request" : "save request", "serial",
                           static_cast<std::uint64_t>(request.serial));
    if (request.type == REQUEST_LOAD) {
        LogInfo("BitmapLoaderImpl::EventLoop process load request[%d]: %s", request.serial, path.Get());
        LoadBitmap(request);
        LogInfo("BitmapLoaderImpl::EventLoop process load request[%d] done: %s", request.serial, path.Get());
    } else {
        LogInfo("BitmapLoaderImpl::EventLoop process save request[%d]: %s", request.serial, path.Get());
        SaveBitmap(request);
        LogInfo("BitmapLoaderImpl::EventLoop process save request[%d] done: %s", request.serial, path.Get());
    }
}

void BitmapLoaderImpl::LoadBitmap(Request& request) {
    std::unique_ptr<Bitmap> decoded = Decode(request);
    bool const wasDecoded = decoded != nullptr;
    if (request.bitmapType == BITMAP_TYPE_CPU) {
        ConfirmLoad(request);
        Report(request, decoded.get(), wasDecoded);
        Discard(request, std::move(decoded));
    } else {
        IMKBitmap* bitmap = nullptr;
        {
            // Confirming and uploading is one step: a load is either cancelled or delivered.
            AutoCriticalSection const lock(*mLock);
            ConfirmLoad(request);
            if (request.listener) bitmap = Upload(request, decoded.get());
        }
        decoded.reset();
        Report(request, bitmap, wasDecoded);
    }
    AutoCriticalSection const lock(*mLock);
    mLoadTaskRunning = false;
    mLoadDoneCondition->Signal();
}

// Removes the request from the queue. If it was cancelled, clears its listener, so that nobody is called.
void BitmapLoaderImpl::ConfirmLoad(Request& request) {
    AutoCriticalSection const lock(*mLock);
    Request const* const head = mQueue ? mQueue->GetHead() : nullptr;
    if (!head || head->serial != request.serial) {
        LogInfo("BitmapLoaderImpl::LoadBitmap queue size(%d). request[%d] canceled.", GetQueueSize(),
                request.serial);
        request.listener = nullptr;
        return;
    }
    mQueue->TakeHead();
    if (request.listener) Guard("OnCallbackPending", [&] { request.listener->OnCallbackPending(); });
}

void BitmapLoaderImpl::SaveBitmap(Request& request) {
    bool const isSaved = Encode(request);
    ConfirmSave(request);
    request.buffer.reset();
    Report(request, isSaved);
    AutoCriticalSection const lock(*mLock);
    mSaveTaskRunning = false;
    mSaveDoneCondition->Signal();
}

// Removes the request from the queue. It is the head, because saves are never cancelled. Its listener may
// have been removed in the meantime.
void BitmapLoaderImpl::ConfirmSave(Request& request) {
    AutoCriticalSection const lock(*mLock);
    RequestList const head = mQueue ? mQueue->TakeHead() : RequestList();
    request.listener = head.empty() ? nullptr : head.front().listener;
    if (request.listener) {
        Guard("OnCallbackPending", [&] { request.listener->OnCallbackPending(); });
    } else {
        LogInfo("BitmapLoaderImpl::SaveBitmap queue size(%d). callback for request[%d] removed.",
                GetQueueSize(), request.serial);
    }
}

} // namespace Moka::detail
