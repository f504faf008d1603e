// GalleryPage.h: makes the gallery's HTML page, which needs only the pictures in the same folder.
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

    // The name of the picture. Its file has this name and an extension.
    std::string GetName() const { return scene->name + (isInStrips ? "-in-strips" : ""); }
};

// Returns the page with the pictures in order, and a heading for each group. device is the name of the
// driver.
std::string MakeGalleryPage(std::vector<GalleryPicture> const& pictures, std::string const& device);

} // namespace Moka::Tool
