// ConversionSteps.h: the common parts of converting one file and converting many.
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
    int quality = 0;        // for BitmapFactory::SaveBitmap
    int maxTextureSize = 0; // 0 keeps the device's limit
    int width = 0;          // width and height 0 keep the file's own size
    int height = 0;
};

struct ConversionEnvironment {
    LogCollector& log;
    Progress& progress;
    Interruption& interruption;
};

ImageInfo ReadInfo(std::string const& path);

// Starts the render thread and clears the log. Throws if the requested size is wider than the device's
// largest texture.
std::unique_ptr<RenderThread> StartQueue(ConversionOptions const& options, ConversionEnvironment const& env);

// Throws if an image that is loaded in its own size is wider than the largest texture.
void CheckWidth(std::string const& input, ImageInfo const& info, ConversionOptions const& options,
                RenderThread const& queue);

// Throws if a strip of the bitmap has no texture. Call it after the queue has caught up.
void CheckStrips(IMKBitmap& bitmap, std::string const& input);

} // namespace Moka::Tool
