// Batch: many images through the GPU, several at a time: the loader's thread decodes and encodes, the render
// thread uploads and reads back, the calling thread drives them.
// Thread:  once in a process, on a thread without a message loop. The loader's thread sleeps on afterwards.
// Fails:   a file that cannot be converted stops no other; its output then is what it was before. Throws
//          Failure when nothing can be converted at all. An interruption tells how many files were done.
// Memory:  no more than the given number of images, each in at most two copies.
#pragma once

#include "apps/moka/BatchPlan.h"
#include "apps/moka/ConversionSteps.h"

#include <string>
#include <vector>

namespace Moka::Tool {

struct BatchRequest {
    std::vector<BatchFile> files;
    std::string folder; // made once there is a driver, and removed again when nothing came into it
    ConversionOptions options;
    int inFlight = 1;
};

struct BatchResult {
    std::vector<std::string> errors; // one for each file that failed, in the order of the files
    double seconds = 0;
};

BatchResult ConvertBatch(BatchRequest const& request, ConversionEnvironment const& environment);

} // namespace Moka::Tool
