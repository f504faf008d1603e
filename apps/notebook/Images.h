// Images: the bitmaps of the page's images, loaded in the background.
// Owner:   the application, which destroys it before its queue.
// Thread:  the window's. The loader's thread calls wake when Poll has a new result.
// Limits:  the number of files and the sum of their pixels are those of a scene.
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

    // Reads the size of the image from the file's header. If the image cannot be put on the page, sets reason and
    // returns false.
    bool Measure(std::string const& file, int& width, int& height, std::string& reason);

    // The first call for a file requests its load. Returns null while it is loading, and if it could not be loaded.
    IMKBitmap* Get(std::string const& file);
    bool HasFailed(std::string const& file) const;

    // Drops all bitmaps, for another page. Get loads them again.
    void Forget() { mEntries.clear(); }

    // Returns the files whose load has ended or failed since the last call.
    std::vector<std::string> Poll();
    bool IsBusy() const { return mPending > 0; }

private:
    struct Entry {
        RefPtr<IMKBitmap> bitmap; // null while it is loading
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
    std::map<std::string, Entry> mEntries; // by file
    int mRequests = 0;
    int mPending = 0;
    std::mutex mMutex;
    std::vector<Result> mResults;
    std::unique_ptr<MKBitmapLoader> mLoader; // destroyed first, because its callbacks use the other members
};

} // namespace Moka::Notebook
