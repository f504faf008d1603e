// Batch: converts many images through the GPU, several at a time. The loader's thread decodes and encodes,
// the render thread uploads and reads back, and the calling thread controls them.
// Thread:  once in a process, on a thread without a message loop. The loader's thread stays idle afterwards.
// Fails:   a file that cannot be converted does not stop the others; its old output is kept. Throws Failure
//          if no file can be converted. An interruption prints how many files were converted.
// Memory:  no more than the given number of images, each in at most two copies.
#pragma once

#include "apps/moka/BatchPlan.h"
#include "apps/moka/ConversionSteps.h"

#include <string>
#include <vector>

namespace Moka::Tool {

struct BatchRequest {
    std::vector<BatchFile> files;
    std::string folder; // created once a driver is found; removed if it stays empty
    ConversionOptions options;
    int inFlight = 1;
};

struct BatchResult {
    std::vector<std::string> errors; // one for each file that failed, in the order of the files
    double seconds = 0;
};

BatchResult ConvertBatch(BatchRequest const& request, ConversionEnvironment const& environment);

} // namespace Moka::Tool
