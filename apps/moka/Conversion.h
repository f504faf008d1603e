// Conversion: converts one image through the GPU: decodes, uploads, clones, reads the clone back, and
// encodes.
// Fails:   throws Failure; an old output file is kept.
// Memory:  the decoded pixels are freed before the read-back buffer is allocated, and the GPU's copy before
//          encoding.
#pragma once

#include "apps/moka/ConversionSteps.h"
#include "apps/moka/StandardStreams.h"

#include <string>

namespace Moka::Tool {

struct ConversionRequest {
    InputFile const& input;
    OutputFile& output;
    ConversionOptions options;
};

struct ConversionResult {
    ImageInfo input;
    ImageInfo output;
    int strips = 0;
    std::string renderer;
};

ConversionResult Convert(ConversionRequest const& request, ConversionEnvironment const& environment);

} // namespace Moka::Tool
