// Document: the page that is open, its file, its autosave, and the note of which page was open last.
// Owner:   the application. Destruction finishes what was requested.
// Thread:  the window's; files are written on a thread of the document's own, in the order of the calls. notify comes
//          from it when Tick has something to do.
// Fails:   with a message to `tell`; errors stay in the window until they are read.
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
        std::function<void()> replaced;                             // another page is open
        std::function<void(std::string const&, bool isError)> tell; // one line for the person
        std::function<void()> notify;
    };
    Document(Callbacks callbacks, std::uint32_t autosaveMilliseconds);
    ~Document();
    Document(Document const&) = delete;
    Document& operator=(Document const&) = delete;

    Page& GetPage() { return mPage; }
    Page const& GetPage() const { return mPage; }
    // It changes when a save elsewhere has ended.
    std::string const& GetPath() const { return mPath; }

    // Closes the page that is open: saves it first. False, with a message, if that fails, or if another window has
    // the page; nothing is opened then.
    bool Open(std::string const& path);
    // Null path: its own. A page that was not read whole needs another one: false, with a message.
    bool Save(std::string const* path);
    bool MustRename() const { return mMustRename; }
    bool HasUnsaved() const { return mHasUnsaved; }
    // Waits until all is on the disk, in the page's file if it may be replaced, else in its journal. False, with a
    // message, if that failed.
    bool Close();

    // Reports the saves that have ended, and starts an autosave that is due. Returns the milliseconds to the next one, or -1.
    int Tick(std::uint32_t now);
    // Work with files, an export for instance, behind what was requested before.
    using Report = PageStore::Report;
    void Run(std::function<Report()> work);
    bool IsBusy() const;

    // What autosaves cost, for --statistics.
    struct Costs {
        int autosaves = 0;
        std::uint64_t bytes = 0;
        double longestHere = 0; // milliseconds, on this thread
        double longestThere = 0;
        double longestSave = 0; // of the whole page, on the document's thread
    };
    Costs const& GetCosts() const { return mCosts; }

    static std::string GetLastPath(); // the page that was open last, or the one for a first start

private:
    bool Lock(std::string const& path);
    void DropOtherLocks();
    void Autosave();
    bool TakeReports(); // true without a failure
    void Take(Report const& report);
    void Work();

    Callbacks const mCallbacks;
    std::uint32_t const mInterval;
    Page mPage;
    std::string mPath;
    std::map<std::string, PageLock> mLocks; // of mPath, and of saves on their way
    std::vector<Splice> mPending;           // not yet in the journal
    std::uint32_t mPendingSince = 0;
    bool mIsTimed = false; // mPendingSince holds
    bool mMustRename = false;
    bool mHasUnsaved = false;
    bool mIsJournalLong = false;
    Costs mCosts;

    PageStore mStore; // the thread's while that is busy
    mutable std::mutex mMutex;
    std::condition_variable mChanged;
    std::deque<std::function<Report()>> mJobs; // the first is being done
    std::vector<Report> mReports;
    bool mIsEnding = false;
    std::thread mThread;
};

} // namespace Moka::Notebook
