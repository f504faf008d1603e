// PageStore: a page on the disk. A save replaces the file atomically, by a rename. Between saves, splices are appended
// to a journal beside it, NAME.journal, so that an autosave writes only the changes.
// Thread:  any, one at a time.
// Crash:   if the process or the machine stops at any moment, Open returns the state after the last completed Append
//          or Save. A journal names the content that it continues, so a journal that an interrupted save left behind
//          is not applied twice.
// Fails:   returns a message and loses nothing. The next Append writes the splices that could not be appended. A page
//          that could not be saved is still in its file and journal.
#pragma once

#include "apps/notebook/Page.h"

#include <cstdint>
#include <string>
#include <vector>

namespace Moka::Notebook {

// Locks a page's path for one process of this machine.
class PageLock {
public:
    explicit PageLock(std::string const& path);
    ~PageLock();
    PageLock(PageLock const&) = delete;
    PageLock& operator=(PageLock const&) = delete;

    // True if another PageLock holds the path.
    bool IsTaken() const { return mIsTaken; }

private:
    int const mSocket;
    bool mIsTaken = false;
};

class PageStore {
public:
    struct Opened {
        Objects objects;
        std::vector<std::string> problems; // not empty if the file must not be replaced
        bool hasUnsaved = false;           // the journal contained splices
    };
    // A file that does not exist is an empty page.
    Opened Open(std::string const& path);

    struct Report {
        bool hasFailed = false;
        std::string message{}; // empty for a successful autosave
        bool isSave = false;
        std::string path{};      // of a save
        std::uint64_t bytes = 0; // appended to the journal
        bool isJournalLong = false;
        double milliseconds = 0; // set by the caller
    };
    Report Append(std::vector<Splice> const& splices);
    // Replaces a journal longer than 4 MiB and twice the page by one splice with the current objects.
    Report Shorten(Objects const& objects);
    // If path is another one, it becomes the page's path.
    Report Save(Objects const& objects, int height, std::string const& path);

private:
    std::string mPath;
    std::uint64_t mFingerprint = 0; // of the page's file
    std::size_t mPageObjects = 0;   // the number of objects in the page's file
    std::uint64_t mWholeBytes = 0;  // of the page when it was last written or read whole
    std::uint64_t mJournalBytes = 0;
    std::string mWaiting; // the text that the next Append writes
};

} // namespace Moka::Notebook
