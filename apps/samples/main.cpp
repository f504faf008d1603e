// moka_samples: draws the demonstration's note page, and compares image files pixel by pixel.
#include "apps/moka/PenStroke.h"
#include "apps/samples/Compare.h"
#include "apps/samples/Note.h"
#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/String.h"
#include "moka/base/System.h"
#include "moka/host/RenderThread.h"
#include "scenes/SceneError.h"
#include "scenes/SceneRenderer.h"

#include <cstdio>
#include <cstring>
#include <memory>
#include <string>

namespace {

using namespace Moka;

int Usage() {
    std::fputs("moka_samples: give --note PAGE.json OUTPUT, or --compare A B\n", stderr);
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

int DrawNote(std::string const& page, std::string const& output) {
    std::string error;
    std::unique_ptr<RenderThread> const queue = RenderThread::Start({}, &error);
    if (!queue) throw Scenes::SceneError(error);
    Tool::PenStroke pen(*queue);
    Scenes::Picture picture = RenderScene(Samples::MakeNote(page), *queue, &pen);
    Bitmap image;
    image.Construct(picture.pixels.data(), picture.width, picture.height,
                    static_cast<int>(picture.GetStride()), Bitmap::kFormatRgba8888, false, false);
    String const name = String::FromFileName(output);
    return BitmapFactory::SaveBitmap(&image, &name, 100) ? 0 : 1;
}

} // namespace

int main(int argc, char** argv) {
    if (argc != 4) return Usage();
    Moka::System::SetBuildTypeEngMode(true); // what the log says names the files
    try {
        if (std::strcmp(argv[1], "--compare") == 0) return CompareFiles(argv[2], argv[3]);
        if (std::strcmp(argv[1], "--note") == 0) return DrawNote(argv[2], argv[3]);
    } catch (std::exception const& error) {
        std::fprintf(stderr, "moka_samples: %s\n", error.what());
        return 1;
    }
    return Usage();
}
