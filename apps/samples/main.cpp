// moka_samples: compares two image files pixel by pixel, for the demonstration.
#include "apps/samples/Compare.h"
#include "moka/base/System.h"

#include <cstdio>
#include <cstring>

namespace {

namespace Samples = Moka::Samples;

int Usage() {
    std::fputs("moka_samples: give --compare A B\n", stderr);
    return 2;
}

int CompareFiles(char const* a, char const* b) {
    Samples::Comparison const result = Samples::Compare(a, b);
    if (!result.isRead) return 1;
    if (!result.isSameSize) {
        std::printf("%s and %s: different sizes\n", a, b);
    } else if (result.differing > 0) {
        std::printf("%s and %s: %lld pixels differ\n", a, b, static_cast<long long>(result.differing));
    } else {
        std::printf("%s and %s: identical\n", a, b);
        return 0;
    }
    return 1;
}

} // namespace

int main(int argc, char** argv) {
    if (argc != 4) return Usage();
    Moka::System::SetBuildTypeEngMode(true); // what the log says names the files
    try {
        if (std::strcmp(argv[1], "--compare") == 0) return CompareFiles(argv[2], argv[3]);
    } catch (std::exception const& error) {
        std::fprintf(stderr, "moka_samples: %s\n", error.what());
        return 1;
    }
    return Usage();
}
