#include "apps/moka/ConversionSteps.h"

#include "apps/moka/Failure.h"
#include "apps/moka/LogCollector.h"
#include "apps/moka/Progress.h"
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

// Explains the largest width: strips divide an image in height only.
std::string TellLimit(ConversionOptions const& options, RenderThread const& queue) {
    std::string const largest = std::to_string(queue.GetContextInfo().maxTextureSize);
    return options.maxTextureSize > 0 ? "--max-texture " + largest + " limits the width, too"
                                      : "this device takes textures up to " + largest;
}

} // namespace

ImageInfo ReadInfo(std::string const& path) {
    String const text = String::FromFileName(path);
    ImageInfo info;
    std::string reason;
    if (BitmapFactory::GetImageInfo(&text, &info, &reason)) return info;
    throw Failure(TellCannot("read", path, reason));
}

std::unique_ptr<RenderThread> StartQueue(ConversionOptions const& options, ConversionEnvironment const& env) {
    // This process has no Java VM.
    MKBitmapFactory_UseNativeDecoder();
    RenderThreadOptions threadOptions;
    threadOptions.limits.maxTextureSize = options.maxTextureSize;
    std::string error;
    std::unique_ptr<RenderThread> queue = RenderThread::Start(threadOptions, &error);
    if (!queue) throw Failure(error);
    if (options.width > queue->GetContextInfo().maxTextureSize)
        throw Failure("--size asks for " + std::to_string(options.width) + " pixels across; " +
                      TellLimit(options, *queue));
    // Failed attempts before a driver was found are no error.
    env.log.Clear();
    env.progress.Tell(queue->GetContextInfo().renderer + ", " + queue->GetContextInfo().path);
    return queue;
}

// Strips divide an image in height, not in width.
void CheckWidth(std::string const& input, ImageInfo const& info, ConversionOptions const& options,
                RenderThread const& queue) {
    int const largest = queue.GetContextInfo().maxTextureSize;
    if (options.width != 0 || info.width <= largest) return;
    std::int64_t const height = std::max<std::int64_t>(1, std::int64_t{info.height} * largest / info.width);
    bool const isChosen = options.maxTextureSize > 0;
    throw Failure(input + " is " + std::to_string(info.width) + " pixels wide; " + TellLimit(options, queue) +
                  (isChosen ? "; name at least " + std::to_string(info.width) + ", or" : ";") +
                  " scale it, for instance with --size " + std::to_string(largest) + "x" +
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
