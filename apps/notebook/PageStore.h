// PageStore: a page on the disk. A save replaces the file at once, by a rename; between saves the splices are appended
// to a journal beside it, NAME.journal, so that an autosave writes what has changed and no more.
// Thread:  any, one at a time.
// Crash:   after the process or the machine ends at any moment, Open gives what was there at the last Append or
//          Save that had finished. A journal names the content that it continues, so one that is left behind by an
//          interrupted save is not applied twice.
// Fails:   a message, and nothing is lost: what could not be appended is tried again with the next Append, a page
//          that could not be saved is still in its file and journal.
#pragma once

#include "apps/notebook/Page.h"

#include <cstdint>
#include <string>
#include <vector>

namespace Moka::Notebook {

// A page's name while a window has it, on this machine: the next window that asks finds it taken.
class PageLock {
public:
    explicit PageLock(std::string const& path);
    ~PageLock();
    PageLock(PageLock const&) = delete;
    PageLock& operator=(PageLock const&) = delete;

    bool IsTaken() const { return mIsTaken; } // by another one

private:
    int const mSocket;
    bool mIsTaken = false;
};

class PageStore {
public:
    struct Opened {
        Objects objects;
        std::vector<std::string> problems; // of the file or its journal: it must not be replaced
        bool hasUnsaved = false;           // the journal held something
    };
    // A file that does not exist is an empty page.
    Opened Open(std::string const& path);

    struct Report {
        bool hasFailed = false;
        std::string message{}; // empty for an autosave that went well
        bool isSave = false;
        std::string path{};      // of a save
        std::uint64_t bytes = 0; // put into the journal
        bool isJournalLong = false;
        double milliseconds = 0; // of whoever measures
    };
    Report Append(std::vector<Splice> const& splices);
    // Writes a journal that is longer than 4 MiB and twice the page anew: the page as it is, without the way there.
    Report Shorten(Objects const& objects);
    // Under another path the page goes on there.
    Report Save(Objects const& objects, int height, std::string const& path);

private:
    std::string mPath;
    std::uint64_t mFingerprint = 0; // of the page's file
    std::size_t mPageObjects = 0;   // in it
    std::uint64_t mWholeBytes = 0;  // of the page when it was last written or read whole
    std::uint64_t mJournalBytes = 0;
    std::string mWaiting; // to be appended
};

} // namespace Moka::Notebook
