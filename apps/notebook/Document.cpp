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
      mThread(&Document::Work, this) {}

Document::~Document() {
    {
        std::lock_guard<std::mutex> const lock(mMutex);
        mIsEnding = true;
        mChanged.notify_all();
    }
    mThread.join();
}

bool Document::Open(std::string const& path) {
    std::string const full = fs::absolute(path).lexically_normal().string();
    // Close drops the locks of other pages.
    if (!Lock(full) || !Close() || !Lock(full)) return false;
    mPath = full;
    DropOtherLocks();
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

bool Document::Lock(std::string const& path) {
    auto const lock = mLocks.try_emplace(path, path).first;
    if (!lock->second.IsTaken()) return true;
    mLocks.erase(lock);
    mCallbacks.tell(path + " is open in another window; close it there, or choose another name", true);
    return false;
}

void Document::DropOtherLocks() {
    for (auto lock = mLocks.begin(); lock != mLocks.end();)
        lock = lock->first == mPath ? std::next(lock) : mLocks.erase(lock);
}

bool Document::Save(std::string const* path) {
    std::string const to = path ? fs::absolute(*path).lexically_normal().string() : GetPath();
    if (mMustRename && to == GetPath()) {
        mCallbacks.tell(to + " was not read whole and is not replaced; save under another name", true);
        return false;
    }
    if (!Lock(to)) return false;
    Autosave();
    mHasUnsaved = false; // until the report says otherwise
    Run([this, objects = mPage.GetObjects(), height = mPage.GetHeight(), to] {
        return mStore.Save(objects, height, to);
    });
    return true;
}

bool Document::Close() {
    if (mMustRename)
        Autosave();
    else if (mHasUnsaved)
        Save(nullptr);
    std::unique_lock<std::mutex> lock(mMutex);
    mChanged.wait(lock, [this] { return mJobs.empty(); });
    lock.unlock();
    return TakeReports();
}

void Document::Autosave() {
    mIsTimed = false;
    if (mPending.empty()) return;
    auto const begin = std::chrono::steady_clock::now();
    Run([this, splices = std::exchange(mPending, {})] { return mStore.Append(splices); });
    if (std::exchange(mIsJournalLong, false))
        Run([this, objects = mPage.GetObjects()] { return mStore.Shorten(objects); });
    std::chrono::duration<double, std::milli> const passed = std::chrono::steady_clock::now() - begin;
    mCosts.longestHere = std::max(mCosts.longestHere, passed.count());
}

bool Document::TakeReports() {
    std::vector<Report> reports;
    {
        std::lock_guard<std::mutex> const lock(mMutex);
        reports.swap(mReports);
    }
    bool isWell = true;
    for (Report const& report : reports) {
        Take(report);
        isWell = isWell && !report.hasFailed;
    }
    if (!IsBusy()) DropOtherLocks();
    return isWell;
}

void Document::Take(Report const& report) {
    if (report.isSave) {
        mCosts.longestSave = std::max(mCosts.longestSave, report.milliseconds);
        mHasUnsaved = mHasUnsaved || report.hasFailed;
        mMustRename = mMustRename && report.hasFailed;
        if (!report.hasFailed) mPath = report.path;
    } else if (report.bytes > 0) {
        ++mCosts.autosaves;
        mCosts.bytes += report.bytes;
        mCosts.longestThere = std::max(mCosts.longestThere, report.milliseconds);
    }
    mIsJournalLong = mIsJournalLong || report.isJournalLong;
    if (!report.message.empty()) mCallbacks.tell(report.message, report.hasFailed);
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

void Document::Run(std::function<Report()> work) {
    std::lock_guard<std::mutex> const lock(mMutex);
    mJobs.push_back(std::move(work));
    mChanged.notify_all();
}

bool Document::IsBusy() const {
    std::lock_guard<std::mutex> const lock(mMutex);
    return !mJobs.empty();
}

void Document::Work() {
    std::unique_lock<std::mutex> lock(mMutex);
    for (;;) {
        mChanged.wait(lock, [this] { return mIsEnding || !mJobs.empty(); });
        if (mJobs.empty()) return;
        std::function<Report()> const job = mJobs.front();
        lock.unlock();
        auto const begin = std::chrono::steady_clock::now();
        Report report = job();
        std::chrono::duration<double, std::milli> const passed = std::chrono::steady_clock::now() - begin;
        report.milliseconds = passed.count();
        lock.lock();
        mReports.push_back(std::move(report));
        mJobs.pop_front();
        mChanged.notify_all();
        lock.unlock();
        mCallbacks.notify();
        lock.lock();
    }
}

} // namespace Moka::Notebook
