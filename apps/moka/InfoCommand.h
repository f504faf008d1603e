// InfoCommand: "moka info" prints the headers of image files, and the properties of the GPU's driver.
#pragma once

namespace CLI {
class App;
}

namespace Moka::Tool {

// The command runs inside app's parsing and throws Failure.
void AddInfoCommand(CLI::App& app);

} // namespace Moka::Tool
