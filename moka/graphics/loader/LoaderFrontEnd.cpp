#include "moka/graphics/loader/LoaderFrontEnd.h"

#include "moka/base/Bitmap.h"
#include "moka/base/Check.h"
#include "moka/base/Export.h"
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/loader/BitmapLoaderImpl.h"
#include "moka/graphics/loader/FrontEndText.h"
#include "moka/graphics/loader/PathForLog.h"
#include "moka/graphics/task/IGLMsgQueue.h"

#include <new>

namespace Moka::detail {
namespace {

using LoggedPath = PathForLog<512>;

BitmapLoaderImpl& Loader() { return BitmapLoaderImpl::GetInstance(); }

char const* ToWord(bool value) { return value ? "true" : "false"; }

void const* AddressOf(void const* object) { return object; }

} // namespace

template <class B>
template <class... Values>
void LoaderFrontEnd<B>::Print(char const* format, Values... values) const {
    if (!mName) return;
    __android_log_print(ANDROID_LOG_INFO, FrontEndKind<B>::kClass, format, FrontEndKind<B>::kClass,
                        AddressOf(this), mName, values...);
}

template <class B>
LoaderFrontEnd<B>::LoaderFrontEnd(char const* name, Callback* callback) : mName(name) {
    try {
        if (callback) mCallback = *callback;
    } catch (std::bad_alloc const&) {
        __android_log_print(ANDROID_LOG_ERROR, FrontEndKind<B>::kClass,
                            "%s: out of memory for the callbacks; none will be called",
                            mName ? mName : "(no name)");
        mCallback = Callback();
    }
}

template <class B>
void LoaderFrontEnd<B>::Detach() {
    Print(FrontEndText::kDestructor, FrontEndKind<B>::kClass);
    Loader().CancelAllLoadRequest(this);
    Loader().RemoveAllSaveCallback(this);
    WaitForCallback();
}

template <class B>
bool LoaderFrontEnd<B>::RequestLoad(int id, String const& path, IGLMsgQueue* queue) {
    return RequestLoad(id, path, queue, 0, 0);
}

template <class B>
bool LoaderFrontEnd<B>::RequestLoad(int id, String const& path, IGLMsgQueue* queue, int width, int height) {
    bool const isAccepted =
        Loader().RequestLoad(this, id, path, FrontEndKind<B>::kType, queue, width, height);
    LoggedPath const shown(path);
    if (shown.IsShown()) {
        Print(FrontEndText::kRequestLoadPath, id, shown.Get(), ToWord(isAccepted));
    } else {
        Print(FrontEndText::kRequestLoad, id, ToWord(isAccepted));
    }
    return isAccepted;
}

template <class B>
void LoaderFrontEnd<B>::CancelLoadRequest(int id) {
    Loader().CancelLoadRequest(this, id);
    Print(FrontEndText::kCancelLoad, id);
}

template <class B>
void LoaderFrontEnd<B>::CancelAllLoadRequest() {
    Loader().CancelAllLoadRequest(this);
    Print(FrontEndText::kCancelAllLoad);
}

template <class B>
bool LoaderFrontEnd<B>::RequestSave(int id, String const& path, unsigned char* buffer, int width, int height,
                                    void* userData, int quality) {
    return LogSave(path, buffer,
                   Loader().RequestSave(this, id, path, buffer, width, height, userData, quality));
}

template <class B>
bool LoaderFrontEnd<B>::LogSave(String const& path, void const* source, bool isAccepted) const {
    LoggedPath const shown(path);
    if (shown.IsShown()) {
        Print(FrontEndText::kRequestSavePath, shown.Get(), source, ToWord(isAccepted));
    } else {
        Print(FrontEndText::kRequestSave, source, ToWord(isAccepted));
    }
    return isAccepted;
}

template <class B>
void LoaderFrontEnd<B>::startEventLoop() {
    BitmapLoaderImpl::EventLoop(&Loader());
}

template <class B>
bool LoaderFrontEnd<B>::startEventLoopBySelf() {
    return BitmapLoaderImpl::EventLoopBySelf(&Loader());
}

template <class B>
void LoaderFrontEnd<B>::WaitUntilMsgQueueRequired() {
    Loader().WaitUntilMsgQueueRequired();
}

template <class B>
void LoaderFrontEnd<B>::WaitForAllSaveRequestsToEnd(IGLMsgQueue* queue) {
    Loader().WaitUntilMsgQueueRequired();
    if (queue) queue->WaitForTasks();
    Loader().WaitForAllSaveRequestsToEnd();
}

template <class B>
void LoaderFrontEnd<B>::WaitForCallback() {
    AutoCriticalSection const lock(mLock);
    while (mCallbackPending) {
        MOKA_CHECK(!BitmapLoaderImpl::IsLoaderThread(),
                   "a callback waits for itself: a front end must not be destroyed, nor waited for, in it");
        mCondition.Wait(mLock);
    }
}

template <class B>
void LoaderFrontEnd<B>::OnLoad(int id, String const& path, B& bitmap) {
    LoggedPath const shown(path);
    if (shown.IsShown()) {
        Print(FrontEndText::kOnLoadPath, id, shown.Get(), AddressOf(&bitmap));
    } else {
        Print(FrontEndText::kOnLoad, id, AddressOf(&bitmap));
    }
    if (mCallback.onLoad) mCallback.onLoad(id, path, bitmap);
}

template <class B>
void LoaderFrontEnd<B>::OnLoadList(int id, String const& path, std::vector<B*>& bitmaps) {
    LoggedPath const shown(path);
    int const count = static_cast<int>(bitmaps.size());
    if (shown.IsShown()) {
        Print(FrontEndText::kOnLoadListPath, id, shown.Get(), AddressOf(&bitmaps), count);
    } else {
        Print(FrontEndText::kOnLoadList, id, AddressOf(&bitmaps), count);
    }
    if (mCallback.onLoadList) mCallback.onLoadList(id, path, bitmaps);
}

template <class B>
void LoaderFrontEnd<B>::OnLoadError(int id, String const& path) {
    LoggedPath const shown(path);
    if (shown.IsShown()) {
        Print(FrontEndText::kOnLoadErrorPath, id, shown.Get());
    } else {
        Print(FrontEndText::kOnLoadError, id);
    }
    if (mCallback.onLoadError) mCallback.onLoadError(id, path);
}

template <class B>
void LoaderFrontEnd<B>::OnSave(int id, String const& path, void* userData) {
    LoggedPath const shown(path);
    if (shown.IsShown()) {
        Print(FrontEndText::kOnSavePath, shown.Get());
    } else {
        Print(FrontEndText::kOnSave);
    }
    if (mCallback.onSave) mCallback.onSave(id, path, userData);
}

template <class B>
void LoaderFrontEnd<B>::OnSaveError(int id, String const& path, void* userData) {
    LoggedPath const shown(path);
    if (shown.IsShown()) {
        Print(FrontEndText::kOnSaveErrorPath, shown.Get());
    } else {
        Print(FrontEndText::kOnSaveError);
    }
    if (mCallback.onSaveError) mCallback.onSaveError(id, path, userData);
}

template <class B>
void LoaderFrontEnd<B>::OnCallbackPending() {
    __android_log_print(ANDROID_LOG_INFO, FrontEndKind<B>::kClass, "%s", "OnCallbackPending");
    AutoCriticalSection const lock(mLock);
    mCallbackPending = true;
}

template <class B>
void LoaderFrontEnd<B>::OnCallbackCompleted() {
    __android_log_print(ANDROID_LOG_INFO, FrontEndKind<B>::kClass, "%s", "OnCallbackCompleted");
    AutoCriticalSection const lock(mLock);
    mCallbackPending = false;
    mCondition.Signal();
}

template class MOKA_API LoaderFrontEnd<Bitmap>;
template class MOKA_API LoaderFrontEnd<IMKBitmap>;

} // namespace Moka::detail
