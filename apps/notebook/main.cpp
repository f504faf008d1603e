// moka-notebook: a window with a page to write on. Exit status: 0 if the window was closed, 1 after an error, 2 for wrong
// usage. An error before the window opens is printed to stderr as one line.
#include "apps/notebook/Notebook.h"
#include "moka/base/Version.h"
#include "moka/base/log/AndroidLog.h"
#include "moka/base/log/LogSink.h"
#include "moka/graphics/bitmap/ImageDecoding.h"

#include <CLI/CLI.hpp>
#include <SDL_syswm.h>
#include <csignal>
#include <cstdio>
#include <cstdlib>

namespace {

using namespace Moka;
using Moka::Notebook::Options;

constexpr char kDescription[] = "Write on a page with a pen, a finger or the mouse.";
constexpr char kFooter[] = "docs/notebook.md lists the keys. Exit status: 0 closed, 1 failed, 2 wrong usage.";

int Fail(std::string const& message) {
    return std::fprintf(stderr, "moka-notebook: %s\n", message.c_str()), 1;
}

bool GetNativeWindow(SDL_Window* window, RenderThreadOptions& options) {
    SDL_SysWMinfo info;
    SDL_VERSION(&info.version);
    if (!SDL_GetWindowWMInfo(window, &info) || info.subsystem != SDL_SYSWM_X11) return false;
    options.nativeWindow = info.info.x11.window;
    options.nativeDisplay = info.info.x11.display;
    return true;
}

int RunInWindow(Options const& options, SDL_Window* window) {
    RenderThreadOptions settings;
    settings.framesInFlight = 1; // for the lowest latency of ink
    settings.tracePath = options.trace;
    if (!GetNativeWindow(window, settings))
        return Fail("the window is not an X11 window; set SDL_VIDEODRIVER=x11");
    std::string error;
    auto const queue = RenderThread::Start(settings, &error);
    if (!queue) return Fail(error);
    Notebook::Notebook notebook(options, window, *queue);
    return notebook.Run();
}

int Run(Options const& options) {
    SDL_SetHint(SDL_HINT_TOUCH_MOUSE_EVENTS, "0");
    SDL_SetHint(SDL_HINT_MOUSE_FOCUS_CLICKTHROUGH, "1");
    SDL_SetHint(SDL_HINT_VIDEODRIVER, "x11");
    if (SDL_Init(SDL_INIT_VIDEO) != 0)
        return Fail(std::string("cannot open a window: ") + SDL_GetError() + "; is DISPLAY set?");
    SDL_Window* const window =
        SDL_CreateWindow("moka-notebook", SDL_WINDOWPOS_UNDEFINED, SDL_WINDOWPOS_UNDEFINED, options.width,
                         options.height, SDL_WINDOW_RESIZABLE);
    int const status = window ? RunInWindow(options, window) : Fail(SDL_GetError());
    if (window) SDL_DestroyWindow(window);
    SDL_Quit();
    return status;
}

// Returns the exit status, or -1 to continue.
int Parse(CLI::App& app, Options& options, int argc, char** argv) {
    app.footer(kFooter);
    app.set_version_flag("--version", "moka-notebook " MOKA_VERSION);
    app.add_option("PAGE", options.page,
                   "The page's file, created if it does not exist; default: the last page");
    app.add_option("--autosave", options.autosave, "Seconds from a change to its autosave; default: 10")
        ->check(CLI::Range(0.01, 3600.0));
    app.add_option("--cache", options.cache, "Memory for the pixels of the page, in MiB; default: 96")
        ->check(CLI::Range(16, 4096));
    app.add_option("--width", options.width, "Width of the window in pixels")->check(CLI::Range(200, 16384));
    app.add_option("--height", options.height, "Height of the window in pixels")
        ->check(CLI::Range(150, 16384));
    app.add_option("--record", options.record, "Record all input in a file")->type_name("FILE");
    app.add_option("--replay", options.replay, "Replay a recorded file")->type_name("FILE");
    app.add_option("--trace", options.trace, "Write a trace for Perfetto")->type_name("FILE");
    app.add_flag("--statistics", options.statistics, "Print times and sizes at the end");
    try {
        app.parse(argc, argv);
    } catch (CLI::ParseError const& error) {
        if (error.get_exit_code() == 0) return app.exit(error);
        return Fail(std::string(error.what()) + "; see moka-notebook --help"), 2;
    }
    return -1;
}

} // namespace

int main(int argc, char** argv) {
    std::signal(SIGXFSZ, SIG_IGN); // so that a write over the file size limit returns an error
    SetLogPriority(ANDROID_LOG_ERROR);
    MKBitmapFactory_UseNativeDecoder();
    try {
        Options options;
        CLI::App app(kDescription, "moka-notebook");
        int const status = Parse(app, options, argc, argv);
        return status >= 0 ? status : Run(options);
    } catch (std::exception const& error) {
        return Fail(error.what());
    }
}
