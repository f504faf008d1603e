// ShaderFixture: shaders over the tracing renderer, on the render thread. Every test ends with nothing
// alive that was not before, and nothing misused.
#pragma once

#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/drawable/ShaderManager.h"
#include "moka/graphics/drawable/Shaders.h"
#include "tests/support/LogCapture.h"
#include "tests/support/RendererTrace.h"

#include <gmock/gmock.h>

#include <string>
#include <vector>

namespace Moka::Testing {

class ShaderFixture : public ::testing::Test {
protected:
    void SetUp() override {
        RendererTrace::Reset();
        ASSERT_TRUE(RendererFactory::AttachContext());
        expectedAlive = RendererTrace::CountLiveObjects();
    }

    void TearDown() override {
        EXPECT_EQ(RendererTrace::CountLiveObjects(), expectedAlive);
        EXPECT_THAT(RendererTrace::GetViolations(), ::testing::IsEmpty());
        RendererFactory::DetachContext();
        RendererTrace::Reset();
    }

    ShaderManager& manager = *ShaderManager::GetInstance();
    LogCapture log;
    int expectedAlive = 0; // for the tests that leak on purpose
};

} // namespace Moka::Testing
