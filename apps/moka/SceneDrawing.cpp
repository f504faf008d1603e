#include "apps/moka/SceneDrawing.h"

#include "apps/moka/Arguments.h"
#include "apps/moka/Failure.h"
#include "apps/moka/Interruption.h"
#include "apps/moka/LogCollector.h"
#include "apps/moka/PenStroke.h"
#include "apps/moka/StandardStreams.h"
#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/String.h"
#include "moka/renderer/RendererFactory.h"
#include "scenes/SceneError.h"

#include <string>

namespace Moka::Tool {

std::unique_ptr<RenderThread> StartForScene(RenderThreadOptions const& options, LogCollector& log) {
    std::string error;
    std::unique_ptr<RenderThread> queue = RenderThread::Start(options, &error);
    if (!queue) throw Failure(error);
    // Failed attempts before a driver was found are no error.
    log.Clear();
    return queue;
}

Scenes::Picture DrawOnGpu(Scenes::Scene const& scene, RenderThread& queue, LogCollector const& log,
                          RendererStatistics& statistics) {
    int const largest = queue.GetContextInfo().maxTextureSize;
    if (scene.width > largest)
        throw Failure(scene.name + " is " + std::to_string(scene.width) +
                      " pixels wide; this device takes textures up to " + std::to_string(largest));
    try {
        PenStroke pen(queue);
        Scenes::Picture picture =
            RenderScene(scene, queue, &pen, [&] { statistics = RendererFactory::GetStatistics(); });
        std::string const error = log.GetError();
        if (error.empty()) return picture;
        throw Failure(scene.name + ": " + error);
    } catch (Scenes::SceneError const& error) {
        log.Throw(error.what());
    }
}

void SavePicture(Scenes::Picture const& picture, OutputFile& output, Interruption& interruption) {
    Bitmap image;
    // The cast is safe: the bitmap is only read.
    image.Construct(const_cast<unsigned char*>(picture.pixels.data()), picture.width, picture.height,
                    static_cast<int>(picture.GetStride()), Bitmap::kFormatRgba8888, false, false);
    std::string const path = output.GetPath();
    String const name = String::FromFileName(path);
    Interruption::Saving const saving(interruption);
    std::string reason;
    if (!BitmapFactory::SaveBitmap(&image, &name, GetUsualQuality(path), &reason))
        throw Failure(TellCannot("save", path, reason));
    output.Take();
}

} // namespace Moka::Tool
