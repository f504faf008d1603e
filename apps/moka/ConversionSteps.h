// ConversionSteps.h: what converting one file and converting many have in common.
// Fails: throws Failure.
#pragma once

#include "moka/base/BitmapFactory.h"

#include <memory>
#include <string>

namespace Moka {
class IMKBitmap;
class RenderThread;
} // namespace Moka

namespace Moka::Tool {

class Interruption;
class LogCollector;
class Progress;

struct ConversionOptions {
    int quality = 0;        // as BitmapFactory::SaveBitmap takes it
    int maxTextureSize = 0; // 0 keeps the device's own
    int width = 0;          // both 0 keeps the file's own size
    int height = 0;
};

struct ConversionEnvironment {
    LogCollector& log;
    Progress& progress;
    Interruption& interruption;
};

ImageInfo ReadInfo(std::string const& path);

// Also refuses a size that no texture of the device can be made for. Clears the log.
std::unique_ptr<RenderThread> StartQueue(ConversionOptions const& options, ConversionEnvironment const& env);

// Refuses an image that is loaded in its own size and is wider than a texture may be.
void CheckWidth(std::string const& input, ImageInfo const& info, ConversionOptions const& options,
                RenderThread const& queue);

// Once the queue has caught up: whether every strip of the bitmap is on the GPU.
void CheckStrips(IMKBitmap& bitmap, std::string const& input);

} // namespace Moka::Tool
