// GalleryPage.h: the contact sheet: one HTML page that needs nothing but the pictures beside it.
#pragma once

#include "scenes/Scene.h"

#include <cstdint>
#include <string>
#include <vector>

namespace Moka::Tool {

struct GalleryPicture {
    Scenes::Scene const* scene;
    bool isInStrips;
    std::uint64_t drawRequests = 0;
    std::uint64_t drawCalls = 0;

    // Of the picture and, with ".png", of its file.
    std::string GetName() const { return scene->name + (isInStrips ? "-in-strips" : ""); }
};

// The pictures in order, under a heading for each group. device tells what drew them.
std::string MakeGalleryPage(std::vector<GalleryPicture> const& pictures, std::string const& device);

} // namespace Moka::Tool
