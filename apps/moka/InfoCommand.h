// InfoCommand: "moka info": what image files say about themselves, and what the GPU's driver does.
#pragma once

namespace CLI {
class App;
}

namespace Moka::Tool {

// The command runs inside app's parsing and throws Failure.
void AddInfoCommand(CLI::App& app);

} // namespace Moka::Tool
