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
    "The input's format follows from its content, the output's from its extension, or with --to from that;\n"
    "standard output (-) gets a PNG unless --to says another.\n"
    "An image is decoded, uploaded, read back and encoded. PNG, mki and WebP keep every pixel,\n"
    "unless WebP is given a quality below 100; JPEG lays what is transparent on white.\n"
    "Of many, each keeps its name but for the extension. One that cannot be converted stops no other; it is\n"
    "named at the end, and the exit status is 1. An interruption leaves no unfinished file.";

struct ConvertOptions {
    std::string input;
    std::vector<std::string> others; // the output, or with a format further inputs
    std::string format;              // of many, or of standard output
    std::string folder;              // empty: one file into another
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
    return "'" + text + "' is no size; write WIDTHxHEIGHT, each 1 to 65535, together within 1 GiB of pixels";
}

// What stands before the driver's details: "llvmpipe (LLVM 15.0.6, 256 bits)".
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

// In the words of the parser, which cannot know how many there may be.
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

// Off the terminal, and without unfinished files; what is told of the result is told afterwards.
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
                        "The folder to write many files to, made if need be; files there are replaced")
            ->type_name("DIR")
            ->check(CLI::Validator(CheckPath, ""));
    folder->needs(format);
    command
        .add_option("--jobs", options.inFlight,
                    "Of many files, at most N in memory at a time; 4 unless given, up to 64")
        ->type_name("N")
        ->check(CLI::Range(1, kMaxInFlight).description(""))
        ->needs(folder);
}

void AddSettings(CLI::App& command, ConvertOptions& options) {
    command
        .add_option("--quality", options.quality,
                    "0 to 100, of JPEG (90 unless given) and WebP (100, lossless, unless given)")
        ->type_name("N")
        ->check(CLI::Range(0, 100).description(""));
    command.add_option("--size", options.size, "Scale to exactly this size while decoding")
        ->type_name("WxH")
        ->check(CLI::Validator(CheckSize, ""));
    command
        .add_option("--max-texture", options.conversion.maxTextureSize,
                    "Use textures of at most N pixels a side; a taller image is cut into strips")
        ->type_name("N")
        ->check(CLI::Range(1, BitmapFactory::kMaxSide).description(""));
    command.add_flag("-q,--quiet", options.quiet, "Print nothing but errors");
    command.add_flag("-v,--verbose", options.verbose, "Tell on stderr what happens, with the library's log");
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
