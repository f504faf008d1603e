#include "apps/moka/ConversionSteps.h"

#include "apps/moka/Failure.h"
#include "apps/moka/LogCollector.h"
#include "moka/base/String.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/bitmap/IMKSubBitmap.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "moka/graphics/bitmap/ImageDecoding.h"
#include "moka/host/RenderThread.h"

#include <algorithm>
#include <cstdint>

namespace Moka::Tool {
namespace {

std::string TellLimit(RenderThread const& queue) {
    return "this device takes textures up to " + std::to_string(queue.GetContextInfo().maxTextureSize);
}

} // namespace

ImageInfo ReadInfo(std::string const& path) {
    String const text(path);
    ImageInfo info;
    std::string reason;
    if (BitmapFactory::GetImageInfo(&text, &info, &reason)) return info;
    throw Failure(TellCannot("read", path, reason));
}

std::unique_ptr<RenderThread> StartQueue(ConversionOptions const& options, LogCollector& log) {
    // There is no Java in this process.
    MKBitmapFactory_UseNativeDecoder();
    RenderThreadOptions threadOptions;
    threadOptions.limits.maxTextureSize = options.maxTextureSize;
    std::string error;
    std::unique_ptr<RenderThread> queue = RenderThread::Start(threadOptions, &error);
    if (!queue) throw Failure(error);
    if (options.width > queue->GetContextInfo().maxTextureSize)
        throw Failure("--size asks for " + std::to_string(options.width) + " pixels across; " +
                      TellLimit(*queue));
    // What was tried in vain before a driver answered is no failure.
    log.Clear();
    return queue;
}

// Height is cut into strips, width is not.
void CheckWidth(std::string const& input, ImageInfo const& info, ConversionOptions const& options,
                RenderThread const& queue) {
    int const largest = queue.GetContextInfo().maxTextureSize;
    if (options.width != 0 || info.width <= largest) return;
    std::int64_t const height = std::max<std::int64_t>(1, std::int64_t{info.height} * largest / info.width);
    throw Failure(input + " is " + std::to_string(info.width) + " pixels wide; " + TellLimit(queue) +
                  "; scale it, for instance with --size " + std::to_string(largest) + "x" +
                  std::to_string(height));
}

void CheckStrips(IMKBitmap& bitmap, std::string const& input) {
    IMKTextureBitmap& strips = *bitmap.GetTextureBitmap();
    for (int i = 0; i < strips.GetSubBitmapCount(); ++i) {
        IMKSubBitmap* const strip = strips.GetSubBitmap(i);
        if (!strip || !strip->GetTexture()) throw Failure(input + ": the GPU has no room for it");
    }
}

} // namespace Moka::Tool
