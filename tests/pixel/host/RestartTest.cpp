// A render thread that starts after another one has stopped draws every scene, also while canvases and drawables of the
// stopped one still hold their programs.
#include "moka/base/RefPtr.h"
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/drawable/MKGaussianBlurDrawable.h"
#include "moka/graphics/factory/BitmapsAndCanvases.h"
#include "moka/host/RenderThread.h"
#include "scenes/SceneRenderer.h"
#include "tests/support/ImageCompare.h"
#include "tests/support/LogCapture.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace Moka::Testing {
namespace {

// What draws with programs, and keeps them for as long as it lives.
struct Holders {
    std::vector<RefPtr<IMKCanvas>> canvases;
    RefPtr<IMKCustomDrawable> custom;
};

std::vector<Picture> DrawScenes(IGLMsgQueue& queue, Holders& holders) {
    holders.custom = RefPtr<IMKCustomDrawable>::Adopt(new MKGaussianBlurDrawable(&queue));
    Scenes::QueueStage stage(queue);
    std::vector<Picture> pictures;
    for (Scenes::Scene const& scene : Scenes::GetScenes()) {
        if (scene.needsPen) continue;
        auto const target = NewBitmap(queue, scene.width, scene.height);
        holders.canvases.push_back(NewCanvas(queue, target));
        DrawScene(scene, *holders.canvases.back(), stage);
        Picture& picture = pictures.emplace_back(scene.width, scene.height);
        target->GetBitmapData(target->GetBitmapRect(), picture.pixels.data());
    }
    return pictures;
}

TEST(Restart, EverySceneIsDrawnWhileCanvasesOfStoppedThreadsHoldTheirPrograms) {
    // Reachable for good: never released, like what an application has forgotten.
    static auto& leaked = *new std::vector<Holders>;
    LogCapture const log;
    std::vector<Picture> first;
    for (int round = 0; round <= 2; ++round) {
        std::string error;
        auto const thread = RenderThread::Start({{}, true, 1, 1}, &error);
        ASSERT_TRUE(thread) << error;
        std::vector<Picture> const pictures = DrawScenes(*thread, leaked.emplace_back());
        if (round == 0) first = pictures;
        for (std::size_t i = 0; i < pictures.size(); ++i) {
            EXPECT_GT(CompareImages(Picture(first[i].width, first[i].height), first[i]).differingPixels, 0)
                << i;
            EXPECT_EQ(CompareImages(first[i], pictures[i]).differingPixels, 0) << i << " of start " << round;
        }
    }
    EXPECT_EQ(log.GetTexts(ANDROID_LOG_ERROR), std::vector<std::string>{});
}

} // namespace
} // namespace Moka::Testing
