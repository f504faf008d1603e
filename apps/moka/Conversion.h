// Conversion: one image through the GPU: decoded, uploaded, shared, read back from the share, encoded.
// Fails:   throws Failure; the output then is what it was before.
// Memory:  the decoded pixels are gone before the read-back buffer is made; the GPU's copy before encoding.
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
