// SceneDrawing.h: the common parts of drawing one scene and drawing the gallery.
// Fails: throws Failure.
#pragma once

#include "moka/host/RenderThread.h"
#include "moka/renderer/RendererStatistics.h"
#include "scenes/SceneRenderer.h"

#include <memory>

namespace Moka::Tool {

class Interruption;
class LogCollector;
class OutputFile;

// Starts the render thread and clears the log.
std::unique_ptr<RenderThread> StartForScene(RenderThreadOptions const& options, LogCollector& log);

// Draws a scene and reads it back. Sets statistics to the renderer's after the last draw.
Scenes::Picture DrawOnGpu(Scenes::Scene const& scene, RenderThread& queue, LogCollector const& log,
                          RendererStatistics& statistics);

// Saves the picture in the format of the extension: JPEG with quality 90, the others lossless.
void SavePicture(Scenes::Picture const& picture, OutputFile& output, Interruption& interruption);

} // namespace Moka::Tool
