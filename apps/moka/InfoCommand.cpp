#include "apps/moka/InfoCommand.h"

#include "apps/moka/Arguments.h"
#include "apps/moka/Failure.h"
#include "apps/moka/LogCollector.h"
#include "apps/moka/StandardStreams.h"
#include "apps/moka/Text.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/String.h"
#include "moka/host/RenderThread.h"

#include <CLI/CLI.hpp>
#include <memory>
#include <string>
#include <vector>

namespace Moka::Tool {
namespace {

struct InfoOptions {
    std::vector<std::string> files;
    bool device = false;
    bool verbose = false;
};

// Describes properties that only some files have.
std::string DescribeRest(ImageInfo const& info) {
    std::string text;
    if (!info.profile.empty()) text += ", profile " + info.profile;
    if (info.orientation != 1)
        text += ", orientation " + std::to_string(info.orientation) + " of 8 (noted, not applied)";
    if (info.frames > 1) text += ", " + std::to_string(info.frames) + " frames (one is read)";
    return text;
}

bool PrintFile(std::string const& name) {
    InputFile const file(name);
    String const path = String::FromFileName(file.GetPath());
    ImageInfo info;
    std::string reason;
    if (!BitmapFactory::GetImageInfo(&path, &info, &reason)) {
        PrintError(file.Explain(TellCannot("read", file.GetPath(), reason)));
        return false;
    }
    unsigned long long const decoded =
        4ULL * static_cast<unsigned>(info.width) * static_cast<unsigned>(info.height);
    std::printf("%s: %s, %dx%d, %s, %llu bytes, %llu decoded%s\n", MakePrintable(file.GetName()).c_str(),
                BitmapFactory::GetFormatName(info.format), info.width, info.height,
                info.hasAlpha ? "alpha" : "opaque", static_cast<unsigned long long>(info.fileBytes), decoded,
                MakePrintable(DescribeRest(info)).c_str());
    return true;
}

void PrintDevice() {
    std::string error;
    std::unique_ptr<RenderThread> const queue = RenderThread::Start({}, &error);
    if (!queue) throw Failure(error);
    RenderContextInfo const& info = queue->GetContextInfo();
    std::printf("renderer         %s\n"
                "vendor           %s\n"
                "version          %s\n"
                "EGL              %s\n"
                "reached through  %s\n"
                "largest texture  %d\n",
                info.renderer.c_str(), info.vendor.c_str(), info.version.c_str(), info.eglVersion.c_str(),
                info.path.c_str(), info.maxTextureSize);
}

// A broken file does not stop the others.
void RunInfo(InfoOptions const& options) {
    if (options.files.empty() && !options.device)
        throw Failure(ExitStatus::Usage, "name a file, or give --device; see moka info --help");
    LogCollector const log(options.verbose);
    bool isAllRead = true;
    for (std::string const& file : options.files) isAllRead = PrintFile(file) && isAllRead;
    if (options.device) PrintDevice();
    if (!isAllRead) throw Failure("");
}

} // namespace

void AddInfoCommand(CLI::App& app) {
    auto const options = std::make_shared<InfoOptions>();
    CLI::App* const command = app.add_subcommand(
        "info", "Print the properties of images: format, size, alpha, bytes on disk, bytes decoded, "
                "colour profile, orientation, frames");
    command->add_option("FILE", options->files, "The images to read; - is standard input")
        ->check(CLI::Validator(CheckPath, ""));
    command->add_flag("--device", options->device,
                      "Print the GPU's driver, its largest texture, and its EGL platform");
    command->add_flag("-v,--verbose", options->verbose, "Print the library's log to stderr");
    command->callback([options] { RunInfo(*options); });
}

} // namespace Moka::Tool
