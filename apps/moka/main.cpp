// moka: the command-line tool. Exit status: 0 success, 1 failure, 2 wrong usage. Every failure prints one
// line to stderr.
#include "apps/moka/ConvertCommand.h"
#include "apps/moka/DrawCommand.h"
#include "apps/moka/Failure.h"
#include "apps/moka/GalleryCommand.h"
#include "apps/moka/InfoCommand.h"
#include "moka/base/Version.h"
#include "moka/base/log/AndroidLog.h"
#include "moka/base/log/LogSink.h"

#include <CLI/CLI.hpp>
#include <csignal>
#include <cstdio>
#include <new>

namespace {

using Moka::Tool::ExitStatus;
using Moka::Tool::Failure;

constexpr char kDescription[] = "Tools of libMokaGraphics, the 2D GPU graphics library.";
constexpr char kFooter[] = "See 'moka COMMAND --help'. Exit status: 0 success, 1 failure, 2 wrong usage.";

std::string Explain(CLI::App const& app, CLI::ParseError const& error) {
    auto const commands = app.get_subcommands();
    if (!commands.empty())
        return std::string(error.what()) + "; see moka " + commands.front()->get_name() + " --help";
    auto const unknown = app.remaining();
    if (unknown.empty()) return "name a command, for instance convert or info; see moka --help";
    bool const isOption = unknown.front().front() == '-';
    return (isOption ? "unknown option '" : "unknown command '") + unknown.front() + "'; see moka --help";
}

int Parse(CLI::App& app, int argc, char** argv) {
    try {
        app.parse(argc, argv);
    } catch (CLI::ParseError const& error) {
        if (error.get_exit_code() == 0) return app.exit(error); // --help and --version throw as well
        throw Failure(ExitStatus::Usage, Explain(app, error));
    }
    return 0;
}

// Reports output that could not be written, for instance to a full disk.
void FlushOutput() {
    if (std::fflush(stdout) != 0 || std::ferror(stdout)) throw Failure("cannot write to standard output");
}

int Run(int argc, char** argv) {
    CLI::App app(kDescription, "moka");
    app.footer(kFooter);
    app.set_version_flag("--version", "moka " MOKA_VERSION);
    app.require_subcommand(1);
    Moka::Tool::AddConvertCommand(app);
    Moka::Tool::AddDrawCommand(app);
    Moka::Tool::AddGalleryCommand(app);
    Moka::Tool::AddInfoCommand(app);
    int const status = Parse(app, argc, argv);
    FlushOutput();
    return status;
}

} // namespace

int main(int argc, char** argv) {
    // A file beyond the size limit then fails to be written, instead of ending the process.
    std::signal(SIGXFSZ, SIG_IGN);
    // Commands collect the library's log. Its threads may log more at process exit; print only errors of
    // those.
    Moka::SetLogPriority(ANDROID_LOG_ERROR);
    try {
        return Run(argc, argv);
    } catch (Failure const& failure) {
        if (failure.what()[0] != '\0') Moka::Tool::PrintError(failure.what());
        return failure.GetStatus();
    } catch (std::bad_alloc const&) {
        Moka::Tool::PrintError("not enough memory");
    } catch (std::exception const& error) {
        Moka::Tool::PrintError(error.what());
    }
    return static_cast<int>(ExitStatus::Failed);
}
