#include "apps/notebook/Images.h"

#include "moka/base/BitmapFactory.h"
#include "moka/base/String.h"
#include "moka/graphics/bitmap/IMKBitmapReadable.h"
#include "scenes/SceneFile.h"

namespace Moka::Notebook {

Images::Images(IGLMsgQueue& queue, std::function<void()> wake) : mQueue(queue), mWake(std::move(wake)) {
    MKBitmapLoader::Callback callback;
    callback.onLoad = [this](int id, String const&, IMKBitmap& bitmap) { Receive(id, &bitmap); };
    callback.onLoadError = [this](int id, String const&) { Receive(id, nullptr); };
    mLoader = std::make_unique<MKBitmapLoader>("notebook", &callback);
    MKBitmapLoader::startEventLoopBySelf();
}

Images::~Images() { mLoader.reset(); }

bool Images::Measure(std::string const& file, int& width, int& height, std::string& reason) {
    ImageInfo info;
    String const name = String::FromFileName(file);
    if (!BitmapFactory::GetImageInfo(&name, &info, &reason)) return false;
    width = info.width;
    height = info.height;
    std::int64_t sum = std::int64_t{width} * height;
    std::size_t count = 1;
    for (auto const& [other, entry] : mEntries) {
        if (other == file || entry.pixels == 0) continue;
        sum += entry.pixels;
        ++count;
    }
    if (sum > Scenes::kMaxPicturePixels)
        reason = "the page's images would have more than " + std::to_string(Scenes::kMaxPicturePixels) +
                 " pixels together; make it smaller";
    else if (count > Scenes::kMaxBitmaps)
        reason = "a page has at most " + std::to_string(Scenes::kMaxBitmaps) + " different images";
    return reason.empty();
}

void Images::Request(std::string const& file, Entry& entry) {
    int width = 0;
    int height = 0;
    std::string reason;
    entry.request = ++mRequests;
    ++mPending;
    bool const mayLoad = Measure(file, width, height, reason);
    entry.pixels = mayLoad ? std::int64_t{width} * height : 0;
    if (!mayLoad || !mLoader->RequestLoad(entry.request, String::FromFileName(file), &mQueue))
        Receive(entry.request, nullptr);
}

IMKBitmap* Images::Get(std::string const& file) {
    auto const [at, isNew] = mEntries.try_emplace(file);
    if (isNew) Request(file, at->second);
    return at->second.bitmap.Get();
}

bool Images::HasFailed(std::string const& file) const {
    auto const at = mEntries.find(file);
    return at != mEntries.end() && at->second.hasFailed;
}

void Images::Receive(int request, IMKBitmap* bitmap) {
    // As the page's file says it: an image is often drawn much smaller than it is.
    if (bitmap) bitmap->GetBitmapReadable()->SetTextureFilter(TextureFilterMipmapped);
    {
        std::lock_guard<std::mutex> const lock(mMutex);
        mResults.push_back({request, RefPtr<IMKBitmap>::Share(bitmap)});
    }
    mWake();
}

std::vector<std::string> Images::Poll() {
    std::vector<Result> results;
    {
        std::lock_guard<std::mutex> const lock(mMutex);
        results.swap(mResults);
    }
    std::vector<std::string> files;
    for (Result& result : results) {
        --mPending;
        for (auto& [file, entry] : mEntries) {
            if (entry.request != result.request) continue; // of a page that was left
            entry.hasFailed = !result.bitmap;
            entry.bitmap = std::move(result.bitmap);
            files.push_back(file);
            break;
        }
    }
    return files;
}

} // namespace Moka::Notebook
