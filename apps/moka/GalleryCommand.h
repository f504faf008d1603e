// GalleryCommand: "moka gallery": every scene of the registry as a picture, and a page that shows them.
#pragma once

namespace CLI {
class App;
}

namespace Moka::Tool {

// The command runs inside app's parsing and throws Failure.
void AddGalleryCommand(CLI::App& app);

} // namespace Moka::Tool
