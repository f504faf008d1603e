#include "apps/moka/GalleryCommand.h"

#include "apps/moka/Arguments.h"
#include "apps/moka/Failure.h"
#include "apps/moka/GalleryPage.h"
#include "apps/moka/Interruption.h"
#include "apps/moka/LogCollector.h"
#include "apps/moka/Progress.h"
#include "apps/moka/SceneDrawing.h"
#include "apps/moka/StandardStreams.h"
#include "apps/moka/Text.h"
#include "moka/renderer/RendererFactory.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <memory>
#include <string>
#include <vector>

namespace Moka::Tool {
namespace {

namespace fs = std::filesystem;

using Scenes::Scene;

constexpr char kDescription[] = "Draw all scenes to PNG files, and write a page that shows them";
constexpr char kFooter[] =
    "    moka gallery --out gallery                 all, and gallery/index.html to open in a browser\n"
    "    moka gallery --out gallery --only clips    one of them\n"
    "    moka gallery --list                        lists all scenes; draws nothing";

struct GalleryOptions {
    std::string folder;
    std::vector<std::string> only;
    bool list = false;
    bool mki = false;
};

struct Gallery {
    std::vector<GalleryPicture> pictures;
    std::vector<Scenes::Picture> pixels; // one for each of pictures
    std::string device;
};

void PrintList() {
    for (Scene const& scene : Scenes::GetScenes())
        std::printf("%-22s %4dx%-4d %s\n", scene.name.c_str(), scene.width, scene.height,
                    scene.about.c_str());
}

void CheckNames(std::vector<std::string> const& names) {
    for (std::string const& name : names) {
        if (!Scenes::FindScene(name))
            throw Failure(ExitStatus::Usage, "there is no scene '" + name + "'; see moka gallery --list");
    }
}

std::vector<GalleryPicture> ChoosePictures(std::vector<std::string> const& only) {
    std::vector<GalleryPicture> pictures;
    for (Scene const& scene : Scenes::GetScenes()) {
        if (!only.empty() && std::find(only.begin(), only.end(), scene.name) == only.end()) continue;
        pictures.push_back({&scene, false});
        if (scene.alsoInStrips) pictures.push_back({&scene, true});
    }
    return pictures;
}

// Returns the options of the render thread for a picture. Each kind of target needs a different one.
RenderThreadOptions OptionsFor(GalleryPicture const& picture) {
    RenderThreadOptions options;
    if (picture.isInStrips) options.limits.maxTextureSize = GetSideForThreeStrips(*picture.scene);
    if (picture.scene->onScreen) {
        options.surfaceWidth = picture.scene->width;
        options.surfaceHeight = picture.scene->height;
    }
    return options;
}

bool IsSameTarget(RenderThreadOptions const& a, RenderThreadOptions const& b) {
    return a.limits.maxTextureSize == b.limits.maxTextureSize && a.surfaceWidth == b.surfaceWidth &&
           a.surfaceHeight == b.surfaceHeight;
}

void DrawAll(Gallery& gallery, LogCollector& log, Progress& progress) {
    std::unique_ptr<RenderThread> queue;
    RenderThreadOptions current;
    for (GalleryPicture& picture : gallery.pictures) {
        progress.SetStage(picture.scene->name.c_str());
        RenderThreadOptions const options = OptionsFor(picture);
        if (!queue || !IsSameTarget(options, current)) {
            queue.reset(); // a process can have one render thread at a time
            queue = StartForScene(options, log);
            current = options;
        }
        RendererStatistics const before = RendererFactory::GetStatistics();
        RendererStatistics after;
        gallery.pixels.push_back(DrawOnGpu(*picture.scene, *queue, log, after));
        picture.drawRequests = after.drawRequests - before.drawRequests;
        picture.drawCalls = after.draws - before.draws;
        gallery.device = queue->GetContextInfo().renderer;
    }
}

// Writes the page to a temporary file and renames it. Interruption removes files with such a temporary name.
void SavePage(std::string const& page, std::string const& folder, Interruption& interruption) {
    fs::path const path = fs::path(folder) / "index.html";
    fs::path const temporary = fs::path(folder) / ".index.html.galley.tmp";
    Interruption::Saving const saving(interruption);
    std::ofstream file(temporary, std::ios::binary);
    file << page;
    file.close();
    std::error_code error;
    if (file) fs::rename(temporary, path, error);
    if (file && !error) return;
    fs::remove(temporary, error);
    throw Failure("cannot write " + path.string());
}

std::string GetPath(GalleryOptions const& options, GalleryPicture const& picture) {
    return (fs::path(options.folder) / (picture.GetName() + (options.mki ? ".mki" : ".png"))).string();
}

void SaveAll(Gallery const& gallery, GalleryOptions const& options, Interruption& interruption) {
    for (std::size_t i = 0; i < gallery.pictures.size(); ++i) {
        OutputFile file(GetPath(options, gallery.pictures[i]), options.mki ? "mki" : "png");
        SavePicture(gallery.pixels[i], file, interruption);
    }
    if (options.mki) return; // browsers cannot show mki files
    SavePage(MakeGalleryPage(gallery.pictures, gallery.device), options.folder, interruption);
}

void PrintPath(fs::path const& path) { std::printf("%s\n", MakePrintable(path.string()).c_str()); }

// Draws everything before it writes files, so that a failure leaves no incomplete gallery.
void RunGallery(GalleryOptions const& options) {
    if (options.list) return PrintList();
    if (options.folder.empty())
        throw Failure(ExitStatus::Usage, "name a folder with --out, or give --list; see moka gallery --help");
    CheckNames(options.only);
    Gallery gallery;
    gallery.pictures = ChoosePictures(options.only);
    {
        Interruption interruption;
        LogCollector log(false);
        Progress progress(Progress::Line);
        DrawAll(gallery, log, progress);
        progress.SetStage("save the pictures");
        MakeFolder(options.folder);
        SaveAll(gallery, options, interruption);
    }
    for (GalleryPicture const& picture : gallery.pictures) PrintPath(GetPath(options, picture));
    if (options.mki) return;
    PrintPath(fs::path(options.folder) / "index.html");
}

} // namespace

void AddGalleryCommand(CLI::App& app) {
    auto const options = std::make_shared<GalleryOptions>();
    CLI::App* const command = app.add_subcommand("gallery", kDescription);
    command->footer(kFooter);
    command
        ->add_option("--out", options->folder,
                     "The folder to write to, created if missing; pictures of the same names are replaced")
        ->type_name("DIR")
        ->check(CLI::Validator(CheckPath, ""));
    command->add_option("--only", options->only, "Only the scenes of these names")->type_name("NAME");
    command->add_flag(
        "--mki", options->mki,
        "Write mki files with the bytes that the GPU holds, to compare drivers; no PNG, no page");
    command->add_flag("--list", options->list, "Print the names, sizes and descriptions of all scenes");
    command->callback([options] { RunGallery(*options); });
}

} // namespace Moka::Tool
