// Reads bytes as a scene file and, where it is one of few operations, draws it over the tracing renderer and
// records it: the recording is a scene again. A text that is no scene is refused with a message of one line that
// begins with the file and a line of it.
#include "fuzz/CanvasWorld.h"
#include "moka/graphics/factory/MKGraphicsFactory.h"
#include "scenes/SceneError.h"
#include "scenes/SceneFile.h"
#include "scenes/SceneRecorder.h"
#include "scenes/SceneRenderer.h"
#include "scenes/SceneText.h"
#include "tests/support/TestFiles.h"

#include <algorithm>
#include <cctype>
#include <set>
#include <string>

namespace Moka::Fuzz {
namespace {

using Scenes::Scene;
using Scenes::SceneValue;

constexpr double kMostDrawn = 500;
constexpr double kMostPixels = 1 << 19;

// How often the most repeated value is drawn, or more, and how many pixels the bitmaps have, or more: the numbers of
// these names multiply what they stand beside.
std::set<std::string> const kRepetitions{"count", "columns", "rows"};
std::set<std::string> const kSides{"width", "height"};

double Count(SceneValue const& value, std::set<std::string> const& factors) {
    double own = 1;
    double within = 0;
    for (std::size_t i = 0; i < value.items.size(); ++i) {
        std::string const name = value.keys.empty() ? "" : value.keys[i];
        if (factors.count(name) > 0) own *= std::max(1.0, value.items[i].number);
        within += Count(value.items[i], factors);
        // A group repeats what stands beside its "repeat".
        if (name == "repeat") own *= Count(value.items[i], factors);
    }
    return own * std::max(1.0, within);
}

void Draw(Scene const& scene, FuzzInput& input) {
    CanvasWorld world(input);
    Scenes::QueueStage stage(world.queue);
    auto const target = RefPtr<IMKBitmap>::Adopt(
        MKGraphicsFactory::CreateBitmap(&world.queue, std::min(scene.width, kMaxSide),
                                        std::min(scene.height, kMaxSide), nullptr, false, 1, false));
    auto const canvas =
        RefPtr<IMKCanvas>::Adopt(MKGraphicsFactory::CreateCanvas(&world.queue, target.Get(), 1));
    Testing::TempFolder const folder;
    std::string const path = folder.Path("scene.json");
    auto const recorder = Scenes::SceneRecorder::Start(path, *canvas);
    Require(static_cast<bool>(recorder), "no recorder");
    Scenes::DrawScene(scene, *recorder, stage);
    try {
        if (recorder->Close()) Scenes::LoadScene(path); // else more than a scene may hold
    } catch (Scenes::SceneError const& error) {
        Require(false, error.what());
    }
}

void RequireMessage(std::string const& text) {
    bool const begins = text.rfind("fuzz.json:", 0) == 0 && text.size() > 10;
    Require(begins && std::isdigit(static_cast<unsigned char>(text[10])) != 0,
            "no file and line in a message");
}

void ReadAndDraw(std::string_view text) {
    FuzzInput nothing(nullptr, 0);
    try {
        SceneValue const root = Scenes::ParseSceneText(text);
        if (Count(root, kSides) > kMostPixels) return;
        bool const isSmall = Count(root, kRepetitions) <= kMostDrawn;
        Scene const scene = Scenes::ParseScene(text, "fuzz.json", "no-such-folder");
        if (isSmall) Draw(scene, nothing);
    } catch (Scenes::SceneTextError const&) {
        // Out of the tree, which knows no file.
    } catch (Scenes::SceneError const& error) {
        RequireMessage(error.what());
    }
}

} // namespace
} // namespace Moka::Fuzz

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    Moka::Fuzz::ReadAndDraw({reinterpret_cast<char const*>(data), size});
    return 0;
}
