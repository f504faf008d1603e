// Conversion: one image through the GPU: decoded, uploaded, shared, read back from the share, encoded.
// Fails:   throws Failure; the output then is what it was before.
// Memory:  the decoded pixels are gone before the read-back buffer is made; the GPU's copy before encoding.
#pragma once

#include "moka/base/BitmapFactory.h"

#include <string>

namespace Moka::Tool {

class Interruption;
class LogCollector;
class Progress;

struct ConversionRequest {
    std::string input;
    std::string output;
    int quality = 0;        // as BitmapFactory::SaveBitmap takes it
    int maxTextureSize = 0; // 0 keeps the device's own
    int width = 0;          // both 0 keeps the file's own size
    int height = 0;
};

struct ConversionResult {
    ImageInfo input;
    ImageInfo output;
    int strips = 0;
    std::string renderer;
};

struct ConversionEnvironment {
    LogCollector& log;
    Progress& progress;
    Interruption& interruption;
};

ConversionResult Convert(ConversionRequest const& request, ConversionEnvironment const& environment);

} // namespace Moka::Tool
