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
    for (auto const& [other, pixels] : mPixels)
        if (other != file) sum += pixels;
    if (sum > Scenes::kMaxPicturePixels)
        reason = "the page's images would have more than " + std::to_string(Scenes::kMaxPicturePixels) +
                 " pixels together; make it smaller";
    else if (mPixels.size() >= Scenes::kMaxBitmaps && mPixels.count(file) == 0)
        reason = "a page has at most " + std::to_string(Scenes::kMaxBitmaps) + " different images";
    if (!reason.empty()) return false;
    mPixels[file] = std::int64_t{width} * height;
    return true;
}

Images::Entry const* Images::Find(std::string const& file) const {
    auto const found = mIndex.find(file);
    return found == mIndex.end() ? nullptr : &mEntries[found->second];
}

Images::Entry& Images::Request(std::string const& file) {
    mIndex[file] = mEntries.size();
    mEntries.push_back({file, {}, false});
    int width = 0;
    int height = 0;
    std::string reason;
    bool const mayLoad = Measure(file, width, height, reason);
    int const id = static_cast<int>(mEntries.size()) - 1;
    if (mayLoad && mLoader->RequestLoad(id, String::FromFileName(file), &mQueue))
        ++mPending;
    else
        mEntries.back().hasFailed = true;
    return mEntries.back();
}

IMKBitmap* Images::Get(std::string const& file) {
    Entry const* const known = Find(file);
    return (known ? *known : Request(file)).bitmap.Get();
}

bool Images::HasFailed(std::string const& file) const {
    Entry const* const entry = Find(file);
    return entry && entry->hasFailed;
}

// Entries stay: requests on their way have their numbers.
void Images::Forget() {
    mIndex.clear();
    mPixels.clear();
    for (Entry& entry : mEntries) entry.bitmap = {};
}

void Images::Receive(int id, IMKBitmap* bitmap) {
    // As the page's file says it: an image is often drawn much smaller than it is.
    if (bitmap) bitmap->GetBitmapReadable()->SetTextureFilter(TextureFilterMipmapped);
    {
        std::lock_guard<std::mutex> const lock(mMutex);
        mResults.push_back({id, RefPtr<IMKBitmap>::Share(bitmap)});
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
        Entry& entry = mEntries[static_cast<std::size_t>(result.id)];
        entry.hasFailed = !result.bitmap;
        entry.bitmap = std::move(result.bitmap);
        files.push_back(entry.file);
        --mPending;
    }
    return files;
}

} // namespace Moka::Notebook
