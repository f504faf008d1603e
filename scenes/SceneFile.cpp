#include "scenes/SceneFile.h"

#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/String.h"
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

constexpr int kMaxSide = 16384;
constexpr int kMaxPictureSide = 4096;
constexpr std::size_t kMaxBitmaps = 64;
constexpr std::uintmax_t kMaxFileBytes = 16u << 20;

struct Content {
    std::vector<Picture> pictures;
    SceneNames names;
    SceneSteps steps;

    void Draw(IMKCanvas& canvas, SceneStage& stage) const {
        SceneBitmaps bitmaps;
        for (Picture const& picture : pictures) {
            bitmaps.push_back(RefPtr<IMKBitmap>::Adopt(stage.MakeBitmap(picture)));
            if (!bitmaps.back()) throw SceneError("there is no room for the scene's bitmaps");
        }
        steps.Play(canvas, bitmaps);
    }
};

Picture LoadPicture(SceneValue const& file, std::string const& what, std::string const& folder) {
    fs::path const path = fs::path(folder) / ReadText(file, what + ": file");
    String const name(path.string());
    std::string reason;
    std::unique_ptr<Bitmap> const image(BitmapFactory::CreateBitmapForGraphics(&name, &reason));
    if (!image)
        throw SceneLineError(file.line, what + ": cannot load the image " + path.string() + ": " + reason);
    Picture picture(image->GetWidth(), image->GetHeight());
    for (int y = 0; y < picture.height; ++y)
        std::memcpy(picture.At(0, y),
                    image->GetBuffer() + static_cast<std::ptrdiff_t>(image->GetStride()) * y,
                    picture.GetStride());
    return picture;
}

Picture ReadPicture(SceneValue const& value, std::string const& what, std::string const& folder) {
    SceneFields fields(value, what);
    Picture picture;
    if (SceneValue const* const file = fields.Find("file")) {
        picture = LoadPicture(*file, what, folder);
    } else {
        std::vector<std::string> const& kinds = GetPictureNames();
        SceneValue const& kind = fields.Get("picture");
        auto const found = std::find(kinds.begin(), kinds.end(), kind.text);
        if (found == kinds.end()) {
            std::string known;
            for (std::string const& name : kinds) known += (known.empty() ? "" : ", ") + name;
            ThrowExpected(kind, fields.Name("picture"), "one of " + known);
        }
        int const width = ReadInt(fields.Get("width"), fields.Name("width"), 1, kMaxPictureSide);
        int const height = ReadInt(fields.Get("height"), fields.Name("height"), 1, kMaxPictureSide);
        picture = MakePicture(static_cast<std::size_t>(found - kinds.begin()), width, height);
    }
    fields.CheckAll();
    return picture;
}

void CheckIsObject(SceneValue const& value, std::string const& what) {
    if (value.kind != Kind::Object) ThrowExpected(value, what, "an object of names, { ... }");
}

void ReadBitmaps(SceneValue const& value, std::string const& folder, Content& content) {
    CheckIsObject(value, "bitmaps");
    if (value.keys.size() > kMaxBitmaps)
        throw SceneLineError(value.line, "a scene may have " + std::to_string(kMaxBitmaps) + " bitmaps");
    for (std::size_t i = 0; i < value.keys.size(); ++i) {
        content.names.bitmaps[value.keys[i]] = i;
        content.pictures.push_back(
            ReadPicture(value.items[i], "the bitmap \"" + value.keys[i] + "\"", folder));
    }
}

void ReadPaints(SceneValue const& value, NamedPaints& paints) {
    CheckIsObject(value, "paints");
    for (std::size_t i = 0; i < value.keys.size(); ++i)
        paints[value.keys[i]] = ReadPaint(value.items[i], "the paint \"" + value.keys[i] + "\"", paints);
}

void ReadSize(SceneFields& fields, Scene& scene) {
    SceneValue const& size = fields.Get("size");
    ReadFloats(size, "size", 2, "[width, height]");
    scene.width = ReadInt(size.items[0], "size: width", 1, kMaxSide);
    scene.height = ReadInt(size.items[1], "size: height", 1, kMaxSide);
}

Scene ReadScene(SceneValue const& root, std::string const& folder) {
    SceneFields fields(root, "a scene");
    Scene scene;
    ReadSize(fields, scene);
    if (SceneValue const* const value = fields.Find("about")) scene.about = ReadText(*value, "about");
    if (SceneValue const* const value = fields.Find("background"))
        scene.background = ReadColor(*value, "background");
    auto const content = std::make_shared<Content>();
    if (SceneValue const* const value = fields.Find("bitmaps")) ReadBitmaps(*value, folder, *content);
    if (SceneValue const* const value = fields.Find("paints")) ReadPaints(*value, content->names.paints);
    content->steps = ReadSteps(fields.Get("operations"), "operations", content->names);
    fields.CheckAll();
    scene.draw = [content](IMKCanvas& canvas, SceneStage& stage) { content->Draw(canvas, stage); };
    return scene;
}

std::string ReadWholeFile(std::string const& path) {
    std::error_code error;
    if (fs::is_directory(path, error)) throw SceneError(path + " is a folder; name a scene's file");
    std::ifstream file(path, std::ios::binary);
    if (!file) throw SceneError("cannot read " + path + ": " + std::strerror(errno));
    std::string text;
    char block[65536];
    while (file.read(block, sizeof(block)) || file.gcount() > 0) {
        text.append(block, static_cast<std::size_t>(file.gcount()));
        if (text.size() > kMaxFileBytes)
            throw SceneError(path + " is larger than " + std::to_string(kMaxFileBytes >> 20) + " MiB");
    }
    return text;
}

} // namespace

Scene ParseScene(std::string_view text, std::string const& name, std::string const& folder) {
    try {
        return ReadScene(ParseSceneText(text), folder);
    } catch (SceneLineError const& error) {
        throw SceneError(name + ":" + std::to_string(error.GetLine()) + ": " + error.what());
    }
}

Scene LoadScene(std::string const& path) {
    fs::path const file(path);
    Scene scene = ParseScene(ReadWholeFile(path), path, file.parent_path().string());
    scene.name = file.stem().string();
    return scene;
}

} // namespace Moka::Scenes
