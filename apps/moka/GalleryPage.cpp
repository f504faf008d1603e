#include "apps/moka/GalleryPage.h"

#include "apps/moka/PageTemplate.h"
#include "moka/base/Version.h"

#include <array>
#include <cstdio>
#include <ctime>

namespace Moka::Tool {
namespace {

constexpr char kPage[] =
#include "GalleryTemplate.inc"
    ;

// Narrower pictures are shown enlarged by kZoom, without smoothing.
constexpr int kSmallWidth = 160;
constexpr int kZoom = 4;

std::string Today() {
    std::time_t const now = std::time(nullptr);
    std::tm utc{};
    gmtime_r(&now, &utc);
    std::array<char, 16> text{};
    std::strftime(text.data(), text.size(), "%Y-%m-%d", &utc);
    return text.data();
}

std::string ToPercent(float part, int whole) {
    std::array<char, 32> text{};
    std::snprintf(text.data(), text.size(), "%.2f",
                  100.0 * static_cast<double>(part) / static_cast<double>(whole));
    return text.data();
}

PageValues MakePicture(GalleryPicture const& picture) {
    Scenes::Scene const& scene = *picture.scene;
    bool const isSmall = scene.width < kSmallWidth;
    int const zoom = isSmall ? kZoom : 1;
    PageValues values;
    values.texts = {{"picture", picture.GetName()},
                    {"width", std::to_string(scene.width)},
                    {"height", std::to_string(scene.height)},
                    {"shownWidth", std::to_string(scene.width * zoom)},
                    {"shownHeight", std::to_string(scene.height * zoom)},
                    {"kind", isSmall ? "enlarged" : ""},
                    {"strips", picture.isInStrips ? ", on three strips" : ""},
                    {"requests", std::to_string(picture.drawRequests)},
                    {"calls", std::to_string(picture.drawCalls)}};
    for (Scenes::SceneLabel const& label : scene.labels)
        values.lists["labels"].push_back({{{"label", label.text},
                                           {"left", ToPercent(label.at.x, scene.width)},
                                           {"top", ToPercent(label.at.y, scene.height)}},
                                          {}});
    return values;
}

PageValues MakeScene(Scenes::Scene const& scene) {
    PageValues values;
    values.texts = {{"scene", scene.name}, {"about", scene.about}, {"text", scene.text}};
    values.lists[scene.text.empty() ? "code" : "json"].emplace_back();
    return values;
}

} // namespace

std::string MakeGalleryPage(std::vector<GalleryPicture> const& pictures, std::string const& device) {
    PageValues page;
    page.texts = {{"version", MOKA_VERSION},
                  {"device", device},
                  {"date", Today()},
                  {"count", std::to_string(pictures.size())}};
    std::vector<PageValues>& groups = page.lists["groups"];
    Scenes::Scene const* last = nullptr;
    for (GalleryPicture const& picture : pictures) {
        Scenes::Scene const& scene = *picture.scene;
        if (!last || last->group != scene.group) {
            groups.emplace_back();
            groups.back().texts = {{"title", GetTitle(scene.group)},
                                   {"group", "group-" + std::to_string(static_cast<int>(scene.group))}};
        }
        std::vector<PageValues>& scenes = groups.back().lists["scenes"];
        if (last != &scene) scenes.push_back(MakeScene(scene));
        scenes.back().lists["pictures"].push_back(MakePicture(picture));
        last = &scene;
    }
    return FillPage(kPage, page);
}

} // namespace Moka::Tool
