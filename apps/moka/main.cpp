// moka: the command-line tool. Exit status: 0 done, 1 failed, 2 wrong usage; every failure is one line on
// stderr.
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
constexpr char kFooter[] = "'moka COMMAND --help' tells more. Exit status: 0 done, 1 failed, 2 wrong usage.";

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
        if (error.get_exit_code() == 0) return app.exit(error); // help and version are "errors" too
        throw Failure(ExitStatus::Usage, Explain(app, error));
    }
    return 0;
}

// Output that never arrived, on a full disk for instance, must not look like success.
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
    // A file over the permitted size then fails to be written instead of ending the process half way.
    std::signal(SIGXFSZ, SIG_IGN);
    // What the library says is collected where it matters. Its threads may say more while the process ends.
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
