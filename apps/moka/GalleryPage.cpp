#include "apps/moka/GalleryPage.h"

namespace Moka::Tool {
namespace {

// Narrower pictures are shown enlarged, pixel by pixel.
constexpr int kSmallWidth = 160;
constexpr int kZoom = 4;

constexpr char kHead[] = R"(<!DOCTYPE html>
<html lang="en">
<head>
<meta charset="utf-8">
<meta name="viewport" content="width=device-width, initial-scale=1">
<title>libMokaGraphics: the gallery</title>
<style>
  body { margin: 0 auto; max-width: 1500px; padding: 1.5rem; background: #fff; color: #222;
         font: 15px/1.45 system-ui, sans-serif; }
  h1 { font-size: 1.6rem; margin: 0; }
  h2 { font-size: 1.15rem; margin: 2.2rem 0 .8rem; padding-top: .8rem; border-top: 1px solid #ddd; }
  nav a { margin-right: .9rem; white-space: nowrap; }
  .group { display: flex; flex-wrap: wrap; gap: 1.6rem; align-items: flex-start; }
  figure { margin: 0; }
  /* What is transparent shows the chequers. */
  img { display: block; max-width: 100%; height: auto; border: 1px solid #ccc;
        background: repeating-conic-gradient(#fff 0 25%, #dfe3ea 0 50%) 0 0 / 16px 16px; }
  img.enlarged { image-rendering: pixelated; }
  figcaption { width: min-content; min-width: 100%; padding-top: .45rem; color: #555; }
  figcaption b { color: #222; }
</style>
</head>
<body>
)";

std::string Escape(std::string const& text) {
    std::string escaped;
    for (char const c : text) {
        switch (c) {
        case '&':
            escaped += "&amp;";
            break;
        case '<':
            escaped += "&lt;";
            break;
        case '>':
            escaped += "&gt;";
            break;
        case '"':
            escaped += "&quot;";
            break;
        default:
            escaped += c;
        }
    }
    return escaped;
}

std::string Anchor(Scenes::SceneGroup group) { return "group-" + std::to_string(static_cast<int>(group)); }

bool BeginsGroup(std::vector<GalleryPicture> const& pictures, std::size_t i) {
    return i == 0 || pictures[i].scene->group != pictures[i - 1].scene->group;
}

std::string MakeContents(std::vector<GalleryPicture> const& pictures) {
    std::string links;
    for (std::size_t i = 0; i < pictures.size(); ++i) {
        Scenes::SceneGroup const group = pictures[i].scene->group;
        if (BeginsGroup(pictures, i))
            links += "<a href=\"#" + Anchor(group) + "\">" + Escape(GetTitle(group)) + "</a>\n";
    }
    return "<nav>\n" + links + "</nav>\n";
}

std::string MakeFigure(GalleryPicture const& picture) {
    Scenes::Scene const& scene = *picture.scene;
    bool const isSmall = scene.width < kSmallWidth;
    int const zoom = isSmall ? kZoom : 1;
    std::string const name = Escape(picture.GetName());
    std::string const about =
        Escape(scene.about + (picture.isInStrips ? " On a target of three strips." : ""));
    return "<figure id=\"" + name + "\"><img src=\"" + name + ".png\"" +
           (isSmall ? " class=\"enlarged\"" : "") + " width=\"" + std::to_string(scene.width * zoom) +
           "\" height=\"" + std::to_string(scene.height * zoom) + "\" alt=\"" + about +
           "\">\n<figcaption><b>" + name + "</b> " + std::to_string(scene.width) + " x " +
           std::to_string(scene.height) + (isSmall ? ", enlarged" : "") + "<br>" + about +
           "<br>draws requested: " + std::to_string(picture.drawRequests) +
           ", draw calls: " + std::to_string(picture.drawCalls) + "</figcaption></figure>\n";
}

} // namespace

std::string MakeGalleryPage(std::vector<GalleryPicture> const& pictures, std::string const& device) {
    std::string page = std::string(kHead) + "<h1>libMokaGraphics: the gallery</h1>\n<p>" +
                       std::to_string(pictures.size()) + " pictures, drawn by " + Escape(device) + ".</p>\n" +
                       MakeContents(pictures);
    for (std::size_t i = 0; i < pictures.size(); ++i) {
        Scenes::SceneGroup const group = pictures[i].scene->group;
        if (BeginsGroup(pictures, i))
            page += std::string(i == 0 ? "" : "</div>\n") + "<h2 id=\"" + Anchor(group) + "\">" +
                    Escape(GetTitle(group)) + "</h2>\n<div class=\"group\">\n";
        page += MakeFigure(pictures[i]);
    }
    return page + "</div>\n</body>\n</html>\n";
}

} // namespace Moka::Tool
