// DrawCommand: "moka draw": a scene out of a JSON file onto a picture.
#pragma once

namespace CLI {
class App;
}

namespace Moka::Tool {

// The command runs inside app's parsing and throws Failure.
void AddDrawCommand(CLI::App& app);

} // namespace Moka::Tool
