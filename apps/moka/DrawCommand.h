// DrawCommand: "moka draw" draws a scene from a JSON file to an image file.
#pragma once

namespace CLI {
class App;
}

namespace Moka::Tool {

// The command runs inside app's parsing and throws Failure.
void AddDrawCommand(CLI::App& app);

} // namespace Moka::Tool
