// GalleryCommand: "moka gallery" draws all scenes to image files and writes a page that shows them.
#pragma once

namespace CLI {
class App;
}

namespace Moka::Tool {

// The command runs inside app's parsing and throws Failure.
void AddGalleryCommand(CLI::App& app);

} // namespace Moka::Tool
