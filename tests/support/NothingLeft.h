// NothingLeft.h: what a test over a real driver must find when it ends.
#pragma once

#include "moka/renderer/RendererStatistics.h"

#include <gtest/gtest.h>

namespace Moka::Testing {

// No object of any kind is alive and the driver has reported no error, or as many as the test provoked. kept:
// names that the renderer may hold for its next use.
inline void ExpectNothingLeft(RendererStatistics const& left, int kept = 0, std::uint64_t errors = 0) {
    EXPECT_LE(left.textures + left.frameBuffers, kept);
    EXPECT_EQ(left.renderBuffers, 0);
    EXPECT_EQ(left.samplers, 0);
    EXPECT_EQ(left.renderTargets, 0);
    EXPECT_EQ(left.textureObjects, 0);
    EXPECT_EQ(left.depthStencilBuffers, 0);
    EXPECT_EQ(left.programs, 0);
    EXPECT_EQ(left.graphicsObjects, 0);
    EXPECT_EQ(left.stateObjects, 0);
    EXPECT_EQ(left.errors, errors);
}

} // namespace Moka::Testing
