// Document: the open page, its file and its autosave. It also stores the path of the last page.
// Owner:   the application. The destructor waits until all requested work is done.
// Thread:  the window's. The document's own thread writes files, in the order of the calls, and calls notify when
//          Tick has work to do.
// Fails:   passes a message to `tell`.
#pragma once

#include "apps/notebook/PageStore.h"

#include <condition_variable>
#include <cstdint>
#include <deque>
#include <functional>
#include <map>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

namespace Moka::Notebook {

class Document {
public:
    struct Callbacks {
        Page::Listener changed;                                     // after each splice
        std::function<void()> replaced;                             // after another page was opened
        std::function<void(std::string const&, bool isError)> tell; // shows one line to the user
        std::function<void()> notify;
    };
    Document(Callbacks callbacks, std::uint32_t autosaveMilliseconds);
    ~Document();
    Document(Document const&) = delete;
    Document& operator=(Document const&) = delete;

    Page& GetPage() { return mPage; }
    Page const& GetPage() const { return mPage; }
    // Changes when a save under another path has ended.
    std::string const& GetPath() const { return mPath; }

    // Saves and closes the open page, then opens path. If the save fails, or another window has the page open, it
    // shows a message, opens nothing and returns false.
    bool Open(std::string const& path);
    // Saves the page under *path, or under its own path if path is null. If the page was not read completely, only
    // another path is accepted: otherwise it shows a message and returns false.
    bool Save(std::string const* path);
    bool MustRename() const { return mMustRename; }
    bool HasUnsaved() const { return mHasUnsaved; }
    // Waits until all changes are on the disk: in the page's file if it may be replaced, otherwise in its journal. If
    // that fails, it shows a message and returns false.
    bool Close();

    // Reports the saves that have ended, and starts an autosave if it is due. Returns the milliseconds until the next
    // autosave, or -1.
    int Tick(std::uint32_t now);
    // Runs work, such as an export, on the document's thread after all earlier requests.
    using Report = PageStore::Report;
    void Run(std::function<Report()> work);
    bool IsBusy() const;

    // The cost of autosaves, for --statistics.
    struct Costs {
        int autosaves = 0;
        std::uint64_t bytes = 0;
        double longestHere = 0;  // milliseconds, on the window's thread
        double longestThere = 0; // on the document's thread
        double longestSave = 0;  // of the whole page, on the document's thread
    };
    Costs const& GetCosts() const { return mCosts; }

    // The path of the last page, or the default path at the first start.
    static std::string GetLastPath();

private:
    bool Lock(std::string const& path);
    void DropOtherLocks();
    void Autosave();
    bool TakeReports(); // returns false if one has failed
    void Take(Report const& report);
    void Work();

    Callbacks const mCallbacks;
    std::uint32_t const mInterval;
    Page mPage;
    std::string mPath;
    std::map<std::string, PageLock> mLocks; // of mPath, and of the paths of pending saves
    std::vector<Splice> mPending;           // not yet in the journal
    std::uint32_t mPendingSince = 0;
    bool mIsTimed = false; // mPendingSince is set
    bool mMustRename = false;
    bool mHasUnsaved = false;
    bool mIsJournalLong = false;
    Costs mCosts;

    PageStore mStore; // only the document's thread uses it while that is busy
    mutable std::mutex mMutex;
    std::condition_variable mChanged;
    std::deque<std::function<Report()>> mJobs; // the first one is running
    std::vector<Report> mReports;
    bool mIsEnding = false;
    std::thread mThread;
};

} // namespace Moka::Notebook
