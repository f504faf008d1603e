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

// Codecs run out of memory, and listeners are not ours: what either throws must not end the loop.
template <class Function>
void Guard(char const* who, Function const& function) {
    RunGuarded(kLoaderTag, who, function);
}

// CPU loads are decoded by the base library, whatever the platform offers for the others.
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

// The pixels pass to the result, if there is one.
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

// The closing line has a condition of its own: a GPU bitmap that could not be made is "OnLoad" there. Relied
// upon.
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

// The listener may go on using the bitmap until the render thread has caught up. Where no render thread takes
// it, it stays for good, as everything does whose deletion is refused; unless nobody ever saw it.
void Discard(Request const& load, std::unique_ptr<Bitmap> decoded) {
    if (!decoded) return;
    bool const isTaken = load.msgQueue && WorkerTask::PostDelete(load.msgQueue, decoded.get());
    if (isTaken || load.listener) static_cast<void>(decoded.release());
}

bool Encode(Request const& save) {
    // A row too wide for any image gets a stride that is refused, instead of one that overflows.
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

// The head stays in the queue, as the sign that the request was not cancelled; what it takes to process it
// goes along.
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
            // Cancelled or delivered: nobody may come in between.
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

// Takes the request out of the queue, or finds that it was cancelled: then nobody is called back.
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

// Takes the request out of the queue. Its listener may have gone meanwhile; the request itself is never
// cancelled, so the head is known to be it.
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
