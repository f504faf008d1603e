#include "apps/notebook/Document.h"

#include "apps/notebook/SafeFile.h"

#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <utility>

namespace Moka::Notebook {
namespace {

namespace fs = std::filesystem;

// As the XDG base directories have it.
fs::path GetUserFolder(char const* variable, char const* inHome) {
    char const* const chosen = std::getenv(variable);
    char const* const home = std::getenv("HOME");
    fs::path const base = chosen && *chosen ? fs::path(chosen) : fs::path(home ? home : "/tmp") / inHome;
    return base / "moka-notebook";
}

fs::path GetNote() { return GetUserFolder("XDG_STATE_HOME", ".local/state") / "last-page"; }

} // namespace

std::string Document::GetLastPath() {
    std::string path;
    std::string reason;
    if (ReadFile(GetNote().string(), path, reason) && !path.empty()) return path;
    fs::path const folder = GetUserFolder("XDG_DATA_HOME", ".local/share");
    std::error_code ignored; // saving will tell
    fs::create_directories(folder, ignored);
    return (folder / "page.json").string();
}

Document::Document(Callbacks callbacks, std::uint32_t autosaveMilliseconds)
    : mCallbacks(std::move(callbacks)),
      mInterval(autosaveMilliseconds),
      mPage([this](Splice const& splice) {
          mPending.push_back(splice);
          mHasUnsaved = true;
          mCallbacks.changed(splice);
      }),
      mStore(mCallbacks.notify) {}

bool Document::Open(std::string const& path) {
    if (!Close()) return false;
    std::string const full = fs::absolute(path).lexically_normal().string();
    PageStore::Opened opened = mStore.Open(full);
    mPage.Reset(std::move(opened.objects));
    mMustRename = !opened.problems.empty();
    mHasUnsaved = opened.hasUnsaved;
    mCallbacks.replaced();
    if (mMustRename) {
        std::size_t const more = opened.problems.size() - 1;
        mCallbacks.tell(opened.problems.front() + (more ? " (and " + std::to_string(more) + " more)" : "") +
                            "; what could be read is shown, and can be saved under another name",
                        true);
    }
    fs::path const note = GetNote();
    std::error_code ignored;
    fs::create_directories(note.parent_path(), ignored);
    ReplaceFile(note.string(), full);
    return true;
}

bool Document::Save(std::string const* path) {
    std::string const to = path ? fs::absolute(*path).lexically_normal().string() : GetPath();
    if (mMustRename && to == GetPath()) {
        mCallbacks.tell(to + " was not read whole and is not replaced; save under another name", true);
        return false;
    }
    Autosave();
    mHasUnsaved = false; // until the report says otherwise
    mStore.Save(mPage.GetObjects(), mPage.GetHeight(), to);
    return true;
}

bool Document::Close() {
    if (mMustRename)
        Autosave();
    else if (mHasUnsaved)
        Save(nullptr);
    mStore.Wait();
    return TakeReports();
}

void Document::Autosave() {
    mIsTimed = false;
    if (mPending.empty()) return;
    auto const begin = std::chrono::steady_clock::now();
    mStore.Append(std::exchange(mPending, {}));
    std::chrono::duration<double, std::milli> const passed = std::chrono::steady_clock::now() - begin;
    mCosts.longestHere = std::max(mCosts.longestHere, passed.count());
}

bool Document::TakeReports() {
    bool isWell = true;
    for (PageStore::Report const& report : mStore.TakeReports()) {
        if (report.isSave) {
            mCosts.longestSave = std::max(mCosts.longestSave, report.milliseconds);
            if (report.hasFailed) mHasUnsaved = true;
            if (!report.hasFailed) mMustRename = false;
        } else if (report.bytes > 0) {
            ++mCosts.autosaves;
            mCosts.bytes += report.bytes;
            mCosts.longestThere = std::max(mCosts.longestThere, report.milliseconds);
        }
        if (!report.message.empty()) mCallbacks.tell(report.message, report.hasFailed);
        isWell = isWell && !report.hasFailed;
    }
    return isWell;
}

int Document::Tick(std::uint32_t now) {
    TakeReports();
    if (mPending.empty()) return -1;
    if (!mIsTimed) mPendingSince = now;
    mIsTimed = true;
    std::uint32_t const passed = now - mPendingSince;
    if (passed < mInterval) return static_cast<int>(mInterval - passed);
    Autosave();
    return -1;
}

} // namespace Moka::Notebook
