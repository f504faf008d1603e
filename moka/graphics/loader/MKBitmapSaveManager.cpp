#include "moka/graphics/loader/MKBitmapSaveManager.h"

#include "moka/base/Handler.h"
#include "moka/base/MessageLoop.h"
#include "moka/base/RunGuarded.h"
#include "moka/base/log/InfoLog.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/loader/MKBitmapLoader.h"
#include "moka/graphics/task/IGLMsgQueue.h"

#include <algorithm>
#include <new>

namespace Moka {
namespace {

constexpr char const* kTag = "mok_log";

constexpr InfoLog LogInfo{kTag};

} // namespace

MKBitmapSaveManager::MKBitmapSaveManager() {
    // The manager may be used without a message loop. A Handler would then log an error.
    if (MessageLoop::GetCurrent()) mHandler.reset(new (std::nothrow) Handler(sm_HandleMessage, this));
    MKBitmapLoader::Callback callback;
    callback.onSave = [this](int, String const&, void* save) { OnSave(save, false); };
    callback.onSaveError = [this](int, String const&, void* save) { OnSave(save, true); };
    mLoader.reset(new (std::nothrow) MKBitmapLoader("Context", &callback));
}

MKBitmapSaveManager::~MKBitmapSaveManager() { LogInfo("SaveManager save remain %d", mSaveCount.load()); }

bool MKBitmapSaveManager::RequestSave(int id, String const& path, IMKBitmap& bitmap, SaveCallback* callback,
                                      int quality) const {
    Save* const save = AddSave(path, callback);
    return save && mLoader && mLoader->RequestSave(id, path, bitmap, save, quality);
}

// If the loader refuses the save afterwards, the save stays in the list and stays counted.
// Compat: refused-save
MKBitmapSaveManager::Save* MKBitmapSaveManager::AddSave(String const& path,
                                                        SaveCallback const* callback) const {
    SaveList added;
    try {
        added.push_back({callback ? *callback : SaveCallback(), path});
    } catch (std::bad_alloc const&) {
        return nullptr;
    }
    AutoCriticalSection const lock(mLock);
    mRequested.splice(mRequested.end(), added);
    LogInfo("SaveManager::RequestSave mSaveCount(%d)", ++mSaveCount);
    return &mRequested.back();
}

// Runs on the loader's thread.
void MKBitmapSaveManager::OnSave(void* save, bool hasError) {
    LogInfo("SaveManager::sm_OnSave mSaveCount(%d) hasError(%d)", mSaveCount.load(),
            static_cast<int>(hasError));
    AutoCriticalSection const lock(mLock);
    auto const at =
        std::find_if(mRequested.begin(), mRequested.end(), [&](Save const& entry) { return &entry == save; });
    if (at == mRequested.end()) return;
    at->hasError = hasError;
    mResults.splice(mResults.end(), mRequested, at);
    if (mHandler && !mHandler->HasMessage()) mHandler->SendMessage();
    mCondition.Signal();
}

void MKBitmapSaveManager::sm_HandleMessage(Handler*, void* manager, int) {
    auto& self = *static_cast<MKBitmapSaveManager*>(manager);
    AutoCriticalSection const lock(self.mLock);
    // Moved to a local list first, because a callback may request further saves, whose results arrive in
    // mResults.
    SaveList results;
    results.swap(self.mResults);
    for (; !results.empty(); results.pop_front()) {
        LogInfo("SaveManager::sm_HandleMessage mSaveCount(%d)", --self.mSaveCount);
        Dispatch(results.front());
    }
}

void MKBitmapSaveManager::Dispatch(Save const& save) {
    auto* const function = save.hasError ? save.callback.onSaveFailed : save.callback.onSaveSucceeded;
    if (!function) return;
    RunGuarded(kTag, "MKBitmapSaveManager: a save's callback",
               [&] { function(save.callback.context, &save.path, save.callback.userData); });
}

void MKBitmapSaveManager::WaitForSaveCompleting(IGLMsgQueue* queue) {
    constexpr char const* kEnd = "SaveManager::WaitForSaveCompleting mSaveCount(%d) End";
    if (mSaveCount == 0) {
        LogInfo(kEnd, 0);
        return;
    }
    if (queue) queue->WaitForTasks();
    for (;;) {
        AutoCriticalSection const lock(mLock);
        LogInfo("SaveManager::WaitForSaveCompleting mSaveCount(%d)", mSaveCount.load());
        sm_HandleMessage(mHandler.get(), this, 0);
        if (mSaveCount == 0) {
            LogInfo(kEnd, 0);
            return;
        }
        LogInfo("SaveManager::WaitForSaveCompleting mSaveCount(%d) Wait", mSaveCount.load());
        mCondition.Wait(mLock);
        LogInfo("SaveManager::WaitForSaveCompleting mSaveCount(%d) Release", mSaveCount.load());
    }
}

} // namespace Moka
