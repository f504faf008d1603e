// Images: the bitmaps of the page's images, loaded in the background.
// Owner:   the application; destroyed before its queue.
// Thread:  the window's; wake is called on the loader's thread when Poll has something new.
// Limits:  as many files, and pixels together, as a scene may have.
#pragma once

#include "moka/base/RefPtr.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/loader/MKBitmapLoader.h"

#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

namespace Moka::Notebook {

class Images {
public:
    Images(IGLMsgQueue& queue, std::function<void()> wake);
    ~Images();

    // The size of the file's image, read from its header, once it may be put on the page. A reason otherwise.
    bool Measure(std::string const& file, int& width, int& height, std::string& reason);

    // Asks for it when it is asked for the first time. Null while it is loaded, and when it cannot be.
    IMKBitmap* Get(std::string const& file);
    bool HasFailed(std::string const& file) const;

    // For another page: everything is loaded anew when it is asked for.
    void Forget() { mEntries.clear(); }

    // Files that were loaded, or could not be, since the last call.
    std::vector<std::string> Poll();
    bool IsBusy() const { return mPending > 0; }

private:
    struct Entry {
        RefPtr<IMKBitmap> bitmap; // null while it is loaded
        bool hasFailed = false;
        int request = 0;
        std::int64_t pixels = 0;
    };
    struct Result {
        int request;
        RefPtr<IMKBitmap> bitmap;
    };

    void Request(std::string const& file, Entry& entry);
    void Receive(int request, IMKBitmap* bitmap);

    IGLMsgQueue& mQueue;
    std::function<void()> const mWake;
    std::map<std::string, Entry> mEntries; // by their files
    int mRequests = 0;
    int mPending = 0;
    std::mutex mMutex;
    std::vector<Result> mResults;
    std::unique_ptr<MKBitmapLoader> mLoader; // goes first: it calls back
};

} // namespace Moka::Notebook
