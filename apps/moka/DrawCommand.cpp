#include "apps/moka/DrawCommand.h"

#include "apps/moka/Arguments.h"
#include "apps/moka/Failure.h"
#include "apps/moka/Interruption.h"
#include "apps/moka/LogCollector.h"
#include "apps/moka/Progress.h"
#include "apps/moka/SceneDrawing.h"
#include "scenes/SceneError.h"
#include "scenes/SceneFile.h"

#include <CLI/CLI.hpp>
#include <cstdio>
#include <memory>
#include <string>

namespace Moka::Tool {
namespace {

constexpr char kDescription[] = "Draw a scene, described in JSON, onto a picture";
constexpr char kFooter[] = "    moka draw scene.json -o out.png\n\n"
                           "    {\"size\": [320, 240], \"background\": \"#FFF0E8\", \"operations\": [\n"
                           "        {\"DrawCircle\": {\"cx\": 160, \"cy\": 120, \"radius\": 80, \"paint\": "
                           "{\"color\": \"#2050A0\"}}}]}\n\n"
                           "docs/scene-format.md describes the format; scenes/data has many more of them.";

struct DrawOptions {
    std::string input;
    std::string output;
};

Scenes::Scene Load(std::string const& path) {
    try {
        return Scenes::LoadScene(path);
    } catch (Scenes::SceneError const& error) {
        throw Failure(error.what());
    }
}

void RunDraw(DrawOptions const& options) {
    CheckOutput(options.output);
    Scenes::Picture picture;
    {
        Interruption interruption;
        LogCollector log(false);
        Progress progress(true);
        progress.SetStage("read the scene");
        Scenes::Scene const scene = Load(options.input);
        progress.SetStage("draw");
        picture = DrawOnGpu(scene, *StartForScene({}, log), log);
        progress.SetStage("encode");
        SavePicture(picture, options.output, interruption);
    }
    std::printf("%s -> %s (%dx%d)\n", options.input.c_str(), options.output.c_str(), picture.width,
                picture.height);
}

} // namespace

void AddDrawCommand(CLI::App& app) {
    auto const options = std::make_shared<DrawOptions>();
    CLI::App* const command = app.add_subcommand("draw", kDescription);
    command->footer(kFooter);
    command->add_option("SCENE", options->input, "The scene's file")
        ->required()
        ->check(CLI::Validator(CheckPath, ""));
    command
        ->add_option("-o", options->output,
                     "The picture to write, PNG, JPEG, WebP or mki by its extension; replaced if it exists")
        ->type_name("OUTPUT")
        ->required()
        ->check(CLI::Validator(CheckPath, ""));
    command->callback([options] { RunDraw(*options); });
}

} // namespace Moka::Tool
