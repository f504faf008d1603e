#include "apps/moka/ConvertCommand.h"

#include "apps/moka/Arguments.h"
#include "apps/moka/Batch.h"
#include "apps/moka/Conversion.h"
#include "apps/moka/Failure.h"
#include "apps/moka/Interruption.h"
#include "apps/moka/LogCollector.h"
#include "apps/moka/Progress.h"
#include "apps/moka/StandardStreams.h"
#include "apps/moka/Text.h"

#include <CLI/CLI.hpp>
#include <cstdint>
#include <cstdio>
#include <memory>
#include <string>
#include <vector>

namespace Moka::Tool {
namespace {

constexpr int kUnset = -1;
constexpr int kInFlight = 4;
constexpr int kMaxInFlight = 64;
constexpr char kUsualFormat[] = "png";

constexpr char kDescription[] = "Convert between PNG, JPEG, WebP and mki, through the GPU";
constexpr char kFooter[] =
    "One file into another:        moka convert photo.jpg page.mki\n"
    "Many files into a folder:     moka convert *.jpg --to mki --out pages\n"
    "Through a pipe:               moka convert - - --to webp <photo.jpg >photo.webp\n\n"
    "The content of the input determines its format. The extension of the output, or --to, determines the\n"
    "format of the output; for standard output (-) the default is PNG.\n"
    "An image is decoded, uploaded, read back and encoded. PNG, mki and WebP are lossless, except WebP with\n"
    "a quality below 100. JPEG flattens transparency on white.\n"
    "With many files, each output has the name of its input and the new extension. A file that cannot be\n"
    "converted does not stop the others; it is named at the end, and the exit status is 1. An interruption\n"
    "leaves no unfinished file.";

struct ConvertOptions {
    std::string input;
    std::vector<std::string> others; // the output, or further inputs if folder is set
    std::string format;              // the format of many files, or of standard output
    std::string folder;              // empty to convert one file
    int inFlight = kInFlight;
    ConversionOptions conversion;
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
    return "'" + text + "' is not a size; write WIDTHxHEIGHT, each 1 to 65535, at most 1 GiB of pixels";
}

// Returns the renderer's name without its details: "llvmpipe" for "llvmpipe (LLVM 15.0.6, 256 bits)".
std::string ShortName(std::string const& renderer) { return renderer.substr(0, renderer.find(" (")); }

std::string Dimensions(ImageInfo const& info) {
    return std::to_string(info.width) + "x" + std::to_string(info.height);
}

void PrintSummary(ConversionRequest const& request, ConversionResult const& result) {
    std::string const before = Dimensions(result.input);
    std::string const after = Dimensions(result.output);
    std::printf(
        "%s (%s %s) -> %s (%s%s, %llu bytes), %d strip%s, %s\n",
        MakePrintable(request.input.GetName()).c_str(), BitmapFactory::GetFormatName(result.input.format),
        before.c_str(), MakePrintable(request.output.GetPath()).c_str(),
        BitmapFactory::GetFormatName(result.output.format), before == after ? "" : (" " + after).c_str(),
        static_cast<unsigned long long>(result.output.fileBytes), result.strips,
        result.strips == 1 ? "" : "s", ShortName(result.renderer).c_str());
}

// Returns the output. The messages follow the parser's wording, which cannot check the number of files
// itself.
std::string TakeOutput(ConvertOptions const& options) {
    if (options.others.empty() && !options.format.empty())
        throw Failure(ExitStatus::Usage, "--to needs --out, a folder for the files, or - as the output");
    if (options.others.empty())
        throw Failure(ExitStatus::Usage, "OUTPUT is required; see moka convert --help");
    if (options.others.size() > 1)
        throw Failure(ExitStatus::Usage, "The following argument was not expected: " + options.others[1] +
                                             "; to convert many files, say --to and --out; see moka convert"
                                             " --help");
    return options.others.front();
}

ConversionOptions Complete(ConvertOptions const& options, std::string const& output) {
    ConversionOptions conversion = options.conversion;
    if (!options.size.empty()) ParseSize(options.size, conversion.width, conversion.height);
    conversion.quality = options.quality == kUnset ? GetUsualQuality(output) : options.quality;
    return conversion;
}

// Calls work with the log collected and interruptions handled. The result is printed afterwards.
template <class Work>
auto RunGuarded(ConvertOptions const& options, Work const& work) {
    Interruption interruption;
    LogCollector log(options.verbose);
    Progress progress(options.verbose ? Progress::Verbose
                      : options.quiet ? Progress::Silent
                                      : Progress::Line);
    return work({log, progress, interruption});
}

void RunSingle(ConvertOptions const& options) {
    std::string const output = TakeOutput(options);
    CheckOutput(output);
    if (!options.format.empty() && !IsStandardStream(output))
        throw Failure(ExitStatus::Usage, "--to needs --out, a folder for the files, or - as the output");
    OutputFile file(output, options.format.empty() ? kUsualFormat : options.format);
    InputFile const input(options.input);
    ConversionRequest const request{input, file, Complete(options, file.GetPath())};
    ConversionResult const result = RunGuarded(
        options, [&](ConversionEnvironment const& environment) { return Convert(request, environment); });
    file.Send();
    if (!options.quiet && !file.IsStream()) PrintSummary(request, result);
}

void PrintSummary(ConvertOptions const& options, std::size_t total, BatchResult const& result) {
    bool const hasSlash = options.folder.back() == '/';
    std::size_t const converted = total - result.errors.size();
    std::printf("%zu of %zu image%s -> %s%s (%s), %.1f files/s\n", converted, total, total == 1 ? "" : "s",
                MakePrintable(options.folder).c_str(), hasSlash ? "" : "/", options.format.c_str(),
                static_cast<double>(converted) / result.seconds);
}

void RunBatch(ConvertOptions const& options) {
    std::vector<std::string> inputs{options.input};
    inputs.insert(inputs.end(), options.others.begin(), options.others.end());
    BatchRequest request;
    request.files = PlanBatch(inputs, options.format, options.folder);
    request.folder = options.folder;
    request.options = Complete(options, request.files.front().output);
    request.inFlight = options.inFlight;
    BatchResult const result = RunGuarded(options, [&](ConversionEnvironment const& environment) {
        return ConvertBatch(request, environment);
    });
    for (std::string const& error : result.errors) PrintError(error);
    if (!options.quiet) PrintSummary(options, inputs.size(), result);
    if (!result.errors.empty()) throw Failure("");
}

void AddFiles(CLI::App& command, ConvertOptions& options) {
    command.add_option("INPUT", options.input, "The image to read; - is standard input")
        ->required()
        ->check(CLI::Validator(CheckPath, ""));
    command
        .add_option("OUTPUT", options.others,
                    "The file to write; replaced if it exists. With --out: further images to read")
        ->check(CLI::Validator(CheckPath, ""));
    CLI::Option* const format =
        command
            .add_option("--to", options.format,
                        "The format of every file, or of standard output: png, jpg, jpeg, webp, mki")
            ->type_name("FORMAT")
            ->check(CLI::Validator(CheckFormat, ""));
    CLI::Option* const folder =
        command
            .add_option("--out", options.folder,
                        "The folder to write many files to, created if missing; files there are replaced")
            ->type_name("DIR")
            ->check(CLI::Validator(CheckPath, ""));
    folder->needs(format);
    command
        .add_option("--jobs", options.inFlight, "The number of files in memory at a time, 1 to 64; default 4")
        ->type_name("N")
        ->check(CLI::Range(1, kMaxInFlight).description(""))
        ->needs(folder);
}

void AddSettings(CLI::App& command, ConvertOptions& options) {
    command
        .add_option("--quality", options.quality,
                    "The quality of JPEG (default 90) and WebP (default 100, lossless), 0 to 100")
        ->type_name("N")
        ->check(CLI::Range(0, 100).description(""));
    command.add_option("--size", options.size, "Scale to exactly this size while decoding")
        ->type_name("WxH")
        ->check(CLI::Validator(CheckSize, ""));
    command
        .add_option("--max-texture", options.conversion.maxTextureSize,
                    "Use textures of at most N pixels a side; taller images are divided into strips")
        ->type_name("N")
        ->check(CLI::Range(1, BitmapFactory::kMaxSide).description(""));
    command.add_flag("-q,--quiet", options.quiet, "Print only errors");
    command.add_flag("-v,--verbose", options.verbose, "Print each step and the library's log to stderr");
}

} // namespace

void AddConvertCommand(CLI::App& app) {
    auto const options = std::make_shared<ConvertOptions>();
    CLI::App* const command = app.add_subcommand("convert", kDescription);
    command->footer(kFooter);
    AddFiles(*command, *options);
    AddSettings(*command, *options);
    command->callback([options] { options->folder.empty() ? RunSingle(*options) : RunBatch(*options); });
}

} // namespace Moka::Tool
