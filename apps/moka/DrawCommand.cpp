#include "apps/moka/DrawCommand.h"

#include "apps/moka/Arguments.h"
#include "apps/moka/Failure.h"
#include "apps/moka/Interruption.h"
#include "apps/moka/LogCollector.h"
#include "apps/moka/Progress.h"
#include "apps/moka/SceneDrawing.h"
#include "apps/moka/StandardStreams.h"
#include "apps/moka/Text.h"
#include "apps/moka/Watch.h"
#include "moka/base/Trace.h"
#include "scenes/SceneError.h"
#include "scenes/SceneFile.h"

#include <CLI/CLI.hpp>
#include <cerrno>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <memory>
#include <string>
#include <unistd.h>

namespace Moka::Tool {
namespace {

constexpr char kDescription[] = "Draw a scene from a JSON file to an image file";
constexpr char kFooter[] =
    "    moka draw scene.json -o out.png            once\n"
    "    moka draw --watch scene.json -o out.png    again whenever the file changes\n\n"
    "    {\"size\": [320, 240], \"background\": \"#FFF0E8\", \"operations\": [\n"
    "        {\"DrawCircle\": {\"cx\": 160, \"cy\": 120, \"radius\": 80, \"paint\": "
    "{\"color\": \"#2050A0\"}}}]}\n\n"
    "docs/scene-format.md describes the format; scenes/data has many examples.";

struct DrawOptions {
    std::string input;
    std::string output;
    std::string format; // the format of standard output
    std::string trace;  // the trace file; empty for none
    bool statistics = false;
    bool watch = false;
    bool verbose = false;
};

Scenes::Scene Load(std::string const& path) {
    try {
        return Scenes::LoadScene(path);
    } catch (Scenes::SceneError const& error) {
        throw Failure(error.what());
    }
}

// The trace of one drawing. Errors of the trace are reported after the picture is written.
class DrawTrace {
public:
    explicit DrawTrace(std::string const& path) {
        if (!path.empty()) Trace::Start(path, &mError);
    }
    ~DrawTrace() { Trace::Stop(nullptr); }
    DrawTrace(DrawTrace const&) = delete;
    DrawTrace& operator=(DrawTrace const&) = delete;

    void Finish() {
        Trace::Stop(mError.empty() ? &mError : nullptr);
        if (!mError.empty()) throw Failure(MakePrintable(mError));
    }

private:
    std::string mError;
};

void PrintStatistics(RendererStatistics const& statistics) {
    auto const print = [](char const* what, std::uint64_t count) {
        std::printf("%s: %llu\n", what, static_cast<unsigned long long>(count));
    };
    print("draws requested", statistics.drawRequests);
    print("runs", statistics.runs);
    print("draw calls", statistics.draws);
    print("records", statistics.records);
    print("variants", static_cast<std::uint64_t>(statistics.variants));
    for (std::size_t i = 0; i < kRunEnds; ++i) {
        std::string const what = std::string("end of run, ") + GetName(static_cast<RunEnd>(i));
        if (statistics.runEnds[i] != 0) print(what.c_str(), statistics.runEnds[i]);
    }
}

// Draws the scene once, with a new render thread.
void Draw(DrawOptions const& options, Interruption& interruption) {
    DrawTrace trace(options.trace);
    OutputFile output(options.output, options.format.empty() ? "png" : options.format);
    Scenes::Picture picture;
    RendererStatistics statistics;
    {
        LogCollector log(options.verbose);
        Progress progress(options.verbose ? Progress::Verbose : Progress::Line);
        progress.SetStage("read the scene");
        Scenes::Scene const scene = Load(options.input);
        progress.SetStage("draw");
        picture = DrawOnGpu(scene, *StartForScene({}, log), log, statistics);
        progress.SetStage("encode");
        SavePicture(picture, output, interruption);
    }
    output.Send();
    if (!output.IsStream()) {
        std::printf("%s -> %s (%dx%d)\n", MakePrintable(options.input).c_str(),
                    MakePrintable(options.output).c_str(), picture.width, picture.height);
        if (options.statistics) PrintStatistics(statistics);
        std::fflush(stdout); // so that a watching program sees it at once
    }
    trace.Finish();
}

// Draws after each change, until it is interrupted. After an error in the scene, the last picture is kept.
[[noreturn]] void DrawAgainAndAgain(DrawOptions const& options, Interruption& interruption) {
    for (FileWatch watch(options.input);; watch.WaitForChange()) {
        try {
            Draw(options, interruption);
        } catch (Failure const& failure) {
            PrintError(failure.what());
        }
    }
}

void RunDraw(DrawOptions const& options) {
    CheckOutput(options.output);
    if (!options.format.empty() && !IsStandardStream(options.output))
        throw Failure(ExitStatus::Usage, "--to is for standard output (-o -); " + options.output +
                                             " has its format by its extension");
    if (!options.trace.empty() && options.trace == options.output)
        throw Failure(ExitStatus::Usage, "the trace and the picture cannot both be " + options.output);
    if (IsStandardStream(options.trace))
        throw Failure(ExitStatus::Usage, "--trace needs the name of a file, not -");
    if (options.statistics && IsStandardStream(options.output))
        throw Failure(ExitStatus::Usage,
                      "--statistics prints to standard output, where -o - sends the picture; name a file");
    bool const isStream = IsStandardStream(options.input) || IsStandardStream(options.output);
    if (options.watch && isStream)
        throw Failure(ExitStatus::Usage, "--watch needs the names of two files, not -");
    if (options.watch && access(options.input.c_str(), R_OK) != 0)
        throw Failure("cannot read " + options.input + ": " + std::strerror(errno));
    Interruption interruption;
    if (options.watch) DrawAgainAndAgain(options, interruption);
    Draw(options, interruption);
}

} // namespace

void AddDrawCommand(CLI::App& app) {
    auto const options = std::make_shared<DrawOptions>();
    CLI::App* const command = app.add_subcommand("draw", kDescription);
    command->footer(kFooter);
    command->add_option("SCENE", options->input, "The scene's file; - is standard input")
        ->required()
        ->check(CLI::Validator(CheckPath, ""));
    command
        ->add_option(
            "-o", options->output,
            "The picture to write, PNG, JPEG, WebP or mki by its extension; replaced if it exists. - is "
            "standard output")
        ->type_name("OUTPUT")
        ->required()
        ->check(CLI::Validator(CheckPath, ""));
    command->add_option("--to", options->format, "The format of standard output; default png")
        ->type_name("FORMAT")
        ->check(CLI::Validator(CheckFormat, ""));
    command->add_flag("--statistics", options->statistics,
                      "Print how many draws were requested, how they merged into draw calls, and what "
                      "kept them apart");
    command->add_flag("-w,--watch", options->watch,
                      "Draw again whenever the scene's file changes, until interrupted");
    command
        ->add_option("--trace", options->trace,
                     "Write a trace of all threads for Perfetto or Chrome's about:tracing; replaced if it "
                     "exists")
        ->type_name("FILE")
        ->check(CLI::Validator(CheckPath, ""));
    command->add_flag("-v,--verbose", options->verbose, "Print each step and the library's log to stderr");
    command->callback([options] { RunDraw(*options); });
}

} // namespace Moka::Tool
