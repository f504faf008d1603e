// ConvertCommand: "moka convert" converts one or many image files to another format, through the GPU.
#pragma once

namespace CLI {
class App;
}

namespace Moka::Tool {

// The command runs inside app's parsing and throws Failure.
void AddConvertCommand(CLI::App& app);

} // namespace Moka::Tool
