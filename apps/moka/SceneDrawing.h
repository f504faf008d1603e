// SceneDrawing.h: what drawing one scene and drawing the gallery have in common.
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

// Clears the log.
std::unique_ptr<RenderThread> StartForScene(RenderThreadOptions const& options, LogCollector& log);

// statistics become the renderer's after the last draw.
Scenes::Picture DrawOnGpu(Scenes::Scene const& scene, RenderThread& queue, LogCollector const& log,
                          RendererStatistics& statistics);

// In the format of the extension: JPEG at quality 90, the others with every pixel.
void SavePicture(Scenes::Picture const& picture, OutputFile& output, Interruption& interruption);

} // namespace Moka::Tool
