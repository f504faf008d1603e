// moka_samples: paints the pictures of the demonstration, and compares image files pixel by pixel.
#include "apps/samples/Compare.h"
#include "apps/samples/Pictures.h"

#include <cstdio>
#include <cstring>
#include <string>

namespace {

constexpr int kPhotoQuality = 92;
constexpr int kLossless = 100;

int Usage() {
    std::fputs("moka_samples: give FOLDER, to paint the pictures there, or --compare A B\n", stderr);
    return 2;
}

int CompareFiles(char const* a, char const* b) {
    Moka::Samples::Comparison const result = Moka::Samples::Compare(a, b);
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

int PaintAll(std::string const& folder) {
    bool const isDone = Moka::Samples::PaintPhoto().Save(folder + "/photo.jpg", kPhotoQuality) &&
                        Moka::Samples::PaintNote().Save(folder + "/note.png", kLossless) &&
                        Moka::Samples::PaintSticker().Save(folder + "/sticker.webp", kLossless) &&
                        Moka::Samples::PaintScroll().Save(folder + "/scroll.png", kLossless);
    return isDone ? 0 : 1;
}

} // namespace

int main(int argc, char** argv) {
    if (argc == 4 && std::strcmp(argv[1], "--compare") == 0) return CompareFiles(argv[2], argv[3]);
    return argc == 2 && argv[1][0] != '-' ? PaintAll(argv[1]) : Usage();
}
