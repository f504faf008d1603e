// PageStore: keeps a page on the disk. A save replaces the file at once, by a rename; between saves the splices are
// appended to a journal beside it, NAME.journal, so that an autosave writes what has changed and no more.
// Owner:   the application. Destruction finishes what was asked for.
// Thread:  the calls on the window's; files are written on a thread of the store's own, in the order of the calls.
// Crash:   after the process or the machine ends at any moment, Open gives what was there at the last Append or
//          Save that had finished. A journal names the content that it continues, so one that is left behind by an
//          interrupted save is not applied twice.
// Fails:   a message, and nothing is lost: what could not be appended is tried again with the next Append, a page
//          that could not be saved is still in its file and journal.
#pragma once

#include "apps/notebook/Page.h"

#include <condition_variable>
#include <cstdint>
#include <deque>
#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

namespace Moka::Notebook {

class PageStore {
public:
    // notify is called on the store's thread when TakeReports has something new.
    explicit PageStore(std::function<void()> notify);
    ~PageStore();
    PageStore(PageStore const&) = delete;
    PageStore& operator=(PageStore const&) = delete;

    struct Opened {
        Objects objects;
        std::vector<std::string> problems; // of the file or its journal: it must not be replaced
        bool hasUnsaved = false;           // the journal held something
    };
    // A file that does not exist is an empty page. Call Wait first.
    Opened Open(std::string const& path);
    // The page's file. It changes when the report of a Save elsewhere is taken.
    std::string const& GetPath() const { return mPath; }

    void Append(std::vector<Splice> splices);
    // Under a path that is not GetPath(), the page goes on there.
    void Save(Objects objects, int height, std::string const& path);
    // Other work with files, an export for instance, behind what was asked for.
    struct Report;
    void Run(std::function<Report()> work) { Post(std::move(work)); }
    bool IsBusy() const;
    // Until all that was asked for is done.
    void Wait();

    struct Report {
        bool hasFailed = false;
        bool isSave = false;
        std::string message;     // empty for an autosave that went well
        std::string path;        // of a save
        std::uint64_t bytes = 0; // appended
        double milliseconds = 0; // on the store's thread
    };
    std::vector<Report> TakeReports();

private:
    struct Files; // of the page, on the store's thread

    void Post(std::function<Report()> job);
    void Work();

    std::function<void()> const mNotify;
    std::string mPath;
    std::unique_ptr<Files> mFiles;
    mutable std::mutex mMutex;
    std::condition_variable mChanged;
    std::deque<std::function<Report()>> mJobs; // the first is being done
    std::vector<Report> mReports;
    bool mIsEnding = false;
    std::thread mThread;
};

} // namespace Moka::Notebook
