// Document: the page that is open, its file, its autosave, and the note of which page was open last.
// Thread:  the window's. notify comes from another thread when Tick has something to do.
// Fails:   with a message to `tell`; errors stay in the window until they are read.
#pragma once

#include "apps/notebook/PageStore.h"

#include <cstdint>
#include <functional>
#include <string>
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

    Page& GetPage() { return mPage; }
    Page const& GetPage() const { return mPage; }
    std::string const& GetPath() const { return mStore.GetPath(); }

    // Closes the page that is open: saves it first. False, with a message, if that fails; nothing is opened then.
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
    // Behind all that is being written.
    void Run(std::function<PageStore::Report()> work) { mStore.Run(std::move(work)); }
    bool IsBusy() const { return mStore.IsBusy(); }

    // What autosaves cost, for --statistics.
    struct Costs {
        int autosaves = 0;
        std::uint64_t bytes = 0;
        double longestHere = 0; // milliseconds, on this thread
        double longestThere = 0;
        double longestSave = 0; // of the whole page, on the store's thread
    };
    Costs const& GetCosts() const { return mCosts; }

    static std::string GetLastPath(); // the page that was open last, or the one for a first start

private:
    void Autosave();
    bool TakeReports(); // true without a failure

    Callbacks const mCallbacks;
    std::uint32_t const mInterval;
    Page mPage;
    PageStore mStore;
    std::vector<Splice> mPending; // not yet in the journal
    std::uint32_t mPendingSince = 0;
    bool mIsTimed = false; // mPendingSince holds
    bool mMustRename = false;
    bool mHasUnsaved = false;
    Costs mCosts;
};

} // namespace Moka::Notebook
