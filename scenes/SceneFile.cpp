#include "scenes/SceneFile.h"

#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/String.h"
#include "moka/graphics/bitmap/IMKBitmapReadable.h"
#include "scenes/Picture.h"
#include "scenes/SceneError.h"
#include "scenes/SceneSteps.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <memory>

namespace Moka::Scenes {
namespace {

namespace fs = std::filesystem;

using Kind = SceneValue::Kind;

constexpr int kMaxSide = BitmapFactory::kMaxSide;
constexpr int kMaxPictureSide = 4096;

struct ScenePicture {
    Picture picture;
    TextureParamFilteringValue filter;
};

struct Content {
    std::vector<ScenePicture> pictures;
    SceneNames names;
    SceneSteps steps;

    void Draw(IMKCanvas& canvas, SceneStage& stage) const {
        SceneBitmaps bitmaps;
        bitmaps.queue = stage.GetQueue();
        if (NeedsGpu() && !bitmaps.queue) throw SceneError("the scene needs a GPU");
        for (ScenePicture const& one : pictures) {
            bitmaps.push_back(RefPtr<IMKBitmap>::Adopt(stage.MakeBitmap(one.picture)));
            if (!bitmaps.back()) throw SceneError("there is no room for the scene's bitmaps");
            if (one.filter != TextureFilterLinear)
                bitmaps.back()->GetBitmapReadable()->SetTextureFilter(one.filter);
        }
        steps.Play(canvas, bitmaps);
    }

    // Drivers filter mipmaps differently, and custom drawables need programs.
    bool NeedsGpu() const {
        return steps.needsGpu || std::any_of(pictures.begin(), pictures.end(), [](ScenePicture const& one) {
                   return one.filter != TextureFilterLinear;
               });
    }
};

// A bitmap whose size is known, before its pixels are loaded.
struct BitmapPlan {
    SceneValue const* source; // its description in the scene
    std::string path;         // the path of the file; empty for a generated picture
    std::size_t kind = 0;
    int width = 0;
    int height = 0;
    TextureParamFilteringValue filter = TextureFilterLinear;
};

[[noreturn]] void ThrowUnreadable(BitmapPlan const& plan, std::string const& reason) {
    throw SceneValueError(*plan.source, ": cannot load the image " + plan.path + ": " + reason);
}

BitmapPlan PlanFile(SceneValue const& file, std::string const& folder) {
    BitmapPlan plan{&file, (fs::path(folder) / ReadText(file)).string()};
    String const name = String::FromFileName(plan.path);
    ImageInfo info;
    std::string reason;
    if (!BitmapFactory::GetImageInfo(&name, &info, &reason)) ThrowUnreadable(plan, reason);
    plan.width = info.width;
    plan.height = info.height;
    return plan;
}

BitmapPlan PlanNamed(SceneFields& fields) {
    std::vector<std::string> const& kinds = GetPictureNames();
    SceneValue const& kind = fields.Get("picture");
    auto const found = std::find(kinds.begin(), kinds.end(), kind.text);
    if (found == kinds.end()) {
        std::string known;
        for (std::string const& name : kinds) known += (known.empty() ? "" : ", ") + name;
        ThrowExpected(kind, "one of " + known);
    }
    return {&kind, "", static_cast<std::size_t>(found - kinds.begin()),
            ReadInt(fields.Get("width"), 1, kMaxPictureSide),
            ReadInt(fields.Get("height"), 1, kMaxPictureSide)};
}

TextureParamFilteringValue ReadFilter(SceneValue const& value) {
    static std::vector<std::string> const kFilters{"Nearest", "Linear", "Mipmapped"};
    int const number = ReadEnum(value, kFilters);
    if (number < 0 || number > TextureFilterMipmapped)
        ThrowExpected(value, "Nearest, Linear or Mipmapped, or 0, 1 or 2");
    return static_cast<TextureParamFilteringValue>(number);
}

BitmapPlan PlanBitmap(SceneValue const& value, std::string const& folder) {
    SceneFields fields(value);
    SceneValue const* const file = fields.Find("file");
    BitmapPlan plan = file ? PlanFile(*file, folder) : PlanNamed(fields);
    if (SceneValue const* const filter = fields.Find("filter")) plan.filter = ReadFilter(*filter);
    fields.CheckAll();
    return plan;
}

Picture LoadPicture(BitmapPlan const& plan) {
    String const name = String::FromFileName(plan.path);
    std::string reason;
    std::unique_ptr<Bitmap> const image(BitmapFactory::CreateBitmapForGraphics(&name, &reason));
    if (!image) ThrowUnreadable(plan, reason);
    Picture picture(image->GetWidth(), image->GetHeight());
    for (int y = 0; y < picture.height; ++y)
        std::memcpy(picture.At(0, y),
                    image->GetBuffer() + static_cast<std::ptrdiff_t>(image->GetStride()) * y,
                    static_cast<std::size_t>(picture.GetStride()));
    return picture;
}

void CheckIsObject(SceneValue const& value) {
    if (value.kind != Kind::Object) ThrowExpected(value, "an object of names, { ... }");
}

void ReadBitmaps(SceneValue const& value, std::string const& folder, Content& content) {
    CheckIsObject(value);
    if (value.keys.size() > kMaxBitmaps)
        throw SceneValueError(value, ": a scene may have " + std::to_string(kMaxBitmaps) + " bitmaps");
    std::vector<BitmapPlan> plans;
    std::int64_t pixels = 0;
    for (std::size_t i = 0; i < value.keys.size(); ++i) {
        content.names.bitmaps[value.keys[i]] = i;
        plans.push_back(PlanBitmap(value.items[i], folder));
        pixels += std::int64_t{plans.back().width} * plans.back().height;
        if (pixels > kMaxPicturePixels)
            throw SceneValueError(value.items[i], ": all bitmaps of a scene together may have " +
                                                      std::to_string(kMaxPicturePixels) + " pixels");
    }
    for (BitmapPlan const& plan : plans)
        content.pictures.push_back(
            {plan.path.empty() ? MakePicture(plan.kind, plan.width, plan.height) : LoadPicture(plan),
             plan.filter});
}

void ReadPaints(SceneValue const& value, NamedPaints& paints) {
    CheckIsObject(value);
    for (std::size_t i = 0; i < value.keys.size(); ++i)
        paints[value.keys[i]] = ReadPaint(value.items[i], paints);
}

void ReadSize(SceneFields& fields, Scene& scene) {
    SceneValue const& size = fields.Get("size");
    ReadFloats(size, 2, "[width, height]");
    scene.width = ReadInt(size.items[0], 1, kMaxSide);
    scene.height = ReadInt(size.items[1], 1, kMaxSide);
    if (std::uint64_t{4} * static_cast<unsigned>(scene.width) * static_cast<unsigned>(scene.height) >
        BitmapFactory::kMaxBytes)
        throw SceneValueError(size, ": more than 1 GiB of pixels");
}

std::vector<SceneLabel> ReadLabels(SceneValue const& value) {
    if (value.kind != Kind::List) ThrowExpected(value, "a list of labels");
    std::vector<SceneLabel> labels;
    for (SceneValue const& item : value.items) {
        SceneFields fields(item);
        labels.push_back({fields.GetPoint("at"), ReadText(fields.Get("text"))});
        fields.CheckAll();
    }
    return labels;
}

Scene ReadScene(SceneValue const& root, std::string const& folder) {
    SceneFields fields(root);
    Scene scene;
    ReadSize(fields, scene);
    if (SceneValue const* const value = fields.Find("about")) scene.about = ReadText(*value);
    if (SceneValue const* const value = fields.Find("background")) scene.background = ReadColor(*value);
    if (SceneValue const* const value = fields.Find("labels")) scene.labels = ReadLabels(*value);
    auto const content = std::make_shared<Content>();
    if (SceneValue const* const value = fields.Find("bitmaps")) ReadBitmaps(*value, folder, *content);
    if (SceneValue const* const value = fields.Find("paints")) ReadPaints(*value, content->names.paints);
    content->steps = ReadSteps(fields.Get("operations"), content->names);
    fields.CheckAll();
    scene.needsGpu = content->NeedsGpu();
    scene.draw = [content](IMKCanvas& canvas, SceneStage& stage) { content->Draw(canvas, stage); };
    return scene;
}

constexpr char kInputName[] = "standard input";

std::string ReadWholeFile(std::string const& path, std::string const& name) {
    std::error_code error;
    if (fs::is_directory(path, error)) throw SceneError(name + " is a folder; name a scene's file");
    std::ifstream file(path, std::ios::binary);
    if (!file) throw SceneError("cannot read " + name + ": " + std::strerror(errno));
    std::string text;
    char block[65536];
    while (file.read(block, sizeof(block)) || file.gcount() > 0) {
        text.append(block, static_cast<std::size_t>(file.gcount()));
        if (text.size() > kMaxFileBytes)
            throw SceneError(name + " is larger than " + std::to_string(kMaxFileBytes >> 20) + " MiB");
    }
    return text;
}

std::string AtPlace(std::string const& name, int line, int column) {
    return name + ':' + std::to_string(line) + ':' + std::to_string(column) + ": ";
}

SceneValue ParseNamed(std::string_view text, std::string const& name) {
    try {
        return ParseSceneText(text);
    } catch (SceneTextError const& error) {
        throw SceneError(AtPlace(name, error.GetLine(), error.GetColumn()) + error.what());
    }
}

} // namespace

Scene ParseScene(std::string_view text, std::string const& name, std::string const& folder) {
    SceneValue const root = ParseNamed(text, name);
    try {
        return ReadScene(root, folder);
    } catch (SceneValueError const& error) {
        SceneValue const& value = error.GetValue();
        throw SceneError(AtPlace(name, value.line, value.column) + FindPath(root, value) + error.what());
    }
}

Scene LoadScene(std::string const& path) {
    if (path == "-") return ParseScene(ReadWholeFile("/dev/stdin", kInputName), kInputName, "");
    fs::path const file(path);
    Scene scene = ParseScene(ReadWholeFile(path, path), path, file.parent_path().string());
    scene.name = file.stem().string();
    return scene;
}

} // namespace Moka::Scenes
