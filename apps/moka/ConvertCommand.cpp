#include "apps/moka/ConvertCommand.h"

#include "apps/moka/Arguments.h"
#include "apps/moka/Conversion.h"
#include "apps/moka/Failure.h"
#include "apps/moka/Interruption.h"
#include "apps/moka/LogCollector.h"
#include "apps/moka/Progress.h"
#include "moka/base/String.h"

#include <CLI/CLI.hpp>
#include <cstdint>
#include <cstdio>
#include <filesystem>
#include <memory>
#include <string>
#include <unistd.h>

namespace Moka::Tool {
namespace {

namespace fs = std::filesystem;

constexpr int kJpegQuality = 90;
constexpr int kLosslessQuality = 100;
constexpr int kUnset = -1;

constexpr char kDescription[] = "Convert between PNG, JPEG, WebP and mki, through the GPU";
constexpr char kFooter[] =
    "The input's format follows from its content, the output's from its extension. The image is decoded,\n"
    "uploaded, shared, read back and encoded. PNG, mki and WebP keep every pixel, unless WebP is given a\n"
    "quality below 100; JPEG lays what is transparent on white.";

struct ConvertOptions {
    ConversionRequest request;
    std::string size;
    int quality = kUnset;
    bool quiet = false;
    bool verbose = false;
};

bool ParseSize(std::string const& text, int& width, int& height) {
    char end = 0;
    bool const isSize = text.find_first_not_of("0123456789x") == std::string::npos && text.size() < 16 &&
                        std::sscanf(text.c_str(), "%dx%d%c", &width, &height, &end) == 2;
    return isSize && width >= 1 && height >= 1 && width <= BitmapFactory::kMaxSide &&
           height <= BitmapFactory::kMaxSide &&
           std::uint64_t(width) * std::uint64_t(height) * 4 <= BitmapFactory::kMaxBytes;
}

std::string CheckSize(std::string const& text) {
    int width = 0;
    int height = 0;
    if (ParseSize(text, width, height)) return {};
    return "'" + text + "' is no size; write WIDTHxHEIGHT, each 1 to 65535, together within 1 GiB of pixels";
}

// Before any work, so that nobody waits for a conversion that cannot be saved.
void CheckOutput(std::string const& output) {
    String const text(output);
    if (BitmapFactory::GetFormatByExtension(&text) == ImageFormat::Unknown)
        throw Failure(ExitStatus::Usage,
                      output + ": its extension names no format; use .png, .jpg, .jpeg, .webp or .mki");
    std::error_code error;
    fs::path const path(output);
    if (fs::is_directory(path, error)) throw Failure(output + " is a folder; name a file to write");
    // Where a link leads is found out when saving.
    if (fs::is_symlink(path, error)) return;
    fs::path const folder = path.has_parent_path() ? path.parent_path() : fs::path(".");
    if (!fs::is_directory(folder, error))
        throw Failure(output + ": there is no folder " + folder.string() + "; create it first");
    if (access(folder.c_str(), W_OK | X_OK) != 0)
        throw Failure(output + ": no permission to write in the folder " + folder.string());
}

// What stands before the driver's details: "llvmpipe (LLVM 15.0.6, 256 bits)".
std::string ShortName(std::string const& renderer) { return renderer.substr(0, renderer.find(" (")); }

std::string Dimensions(ImageInfo const& info) {
    return std::to_string(info.width) + "x" + std::to_string(info.height);
}

void PrintSummary(ConversionRequest const& request, ConversionResult const& result) {
    std::string const before = Dimensions(result.input);
    std::string const after = Dimensions(result.output);
    std::printf("%s (%s %s) -> %s (%s%s, %llu bytes), %d strip%s, %s\n", request.input.c_str(),
                BitmapFactory::GetFormatName(result.input.format), before.c_str(), request.output.c_str(),
                BitmapFactory::GetFormatName(result.output.format),
                before == after ? "" : (" " + after).c_str(),
                static_cast<unsigned long long>(result.output.fileBytes), result.strips,
                result.strips == 1 ? "" : "s", ShortName(result.renderer).c_str());
}

int ChooseQuality(ConvertOptions const& options) {
    if (options.quality != kUnset) return options.quality;
    String const output(options.request.output);
    return BitmapFactory::GetFormatByExtension(&output) == ImageFormat::Jpeg ? kJpegQuality
                                                                             : kLosslessQuality;
}

void RunConvert(ConvertOptions const& options) {
    ConversionRequest request = options.request;
    CheckOutput(request.output);
    if (!options.size.empty()) ParseSize(options.size, request.width, request.height);
    request.quality = ChooseQuality(options);

    ConversionResult result;
    {
        Interruption interruption;
        LogCollector log(options.verbose);
        Progress progress(!options.quiet && !options.verbose);
        result = Convert(request, {log, progress, interruption});
    }
    if (!options.quiet) PrintSummary(request, result);
}

} // namespace

void AddConvertCommand(CLI::App& app) {
    auto const options = std::make_shared<ConvertOptions>();
    CLI::App* const command = app.add_subcommand("convert", kDescription);
    command->footer(kFooter);
    command->add_option("INPUT", options->request.input, "The image to read")
        ->required()
        ->check(CLI::Validator(CheckPath, ""));
    command->add_option("OUTPUT", options->request.output, "The file to write; replaced if it exists")
        ->required()
        ->check(CLI::Validator(CheckPath, ""));
    command
        ->add_option("--quality", options->quality,
                     "0 to 100, of JPEG (90 unless given) and WebP (100, lossless, unless given)")
        ->type_name("N")
        ->check(CLI::Range(0, 100).description(""));
    command->add_option("--size", options->size, "Scale to exactly this size while decoding")
        ->type_name("WxH")
        ->check(CLI::Validator(CheckSize, ""));
    command
        ->add_option("--max-texture", options->request.maxTextureSize,
                     "Use textures of at most N pixels a side; a taller image is cut into strips")
        ->type_name("N")
        ->check(CLI::Range(1, BitmapFactory::kMaxSide).description(""));
    command->add_flag("-q,--quiet", options->quiet, "Print nothing but errors");
    command->add_flag("-v,--verbose", options->verbose, "Print the library's log to stderr");
    command->callback([options] { RunConvert(*options); });
}

} // namespace Moka::Tool
