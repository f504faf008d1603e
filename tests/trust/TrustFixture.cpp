#include "tests/trust/TrustFixture.h"

#include "moka/base/log/LogSink.h"
#include "moka/graphics/bitmap/ImageDecoding.h"
#include "moka/graphics/drawable/ShaderManager.h"
#include "moka/graphics/drawable/Shaders.h"
#include "moka/renderer/RendererFactory.h"
#include "tests/support/RendererTrace.h"
#include "tests/support/TestImages.h"
#include "tests/trust/Faults.h"

#include <exception>
#include <map>
#include <new>
#include <sstream>
#include <typeinfo>

namespace Moka::Testing {
namespace {

class FrameText {
public:
    std::string Describe(TracedEvent const& event) {
        if (auto const* const draw = std::get_if<TracedDraw>(&event)) return Describe(*draw);
        return Describe(std::get<TracedClear>(event));
    }

private:
    // "target 17" as the first target that appears: "target #0".
    std::string Name(std::string const& object) {
        std::string const kind = object.substr(0, object.find(' '));
        auto& known = mNames[kind];
        auto const at = known.emplace(object, known.size()).first;
        return kind + " #" + std::to_string(at->second);
    }

    void AddScissor(std::ostringstream& text, PipelineState const& state) {
        if (!state.scissorOn) return;
        text << " scissor " << state.scissor.x << ' ' << state.scissor.y << ' ' << state.scissor.width << ' '
             << state.scissor.height;
    }

    std::string Describe(TracedDraw const& draw) {
        std::ostringstream text;
        text << draw.shader << " into " << Name(draw.target) << " with " << Name(draw.buffer) << " count "
             << draw.count;
        auto const& blend = draw.state.blend;
        auto const& stencil = draw.state.depthStencil;
        text << " blend " << blend.IsBlending() << blend.IsColorWrite() << ' '
             << static_cast<int>(blend.GetColorEquation().source) << ' '
             << static_cast<int>(blend.GetColorEquation().destination) << " stencil "
             << draw.state.stencilClip << ' ' << stencil.GetComparison() << ' ' << stencil.GetReference()
             << ' ' << stencil.GetPass();
        AddScissor(text, draw.state);
        for (float const number : draw.vertices) text << ' ' << number;
        for (auto const& [name, value] : draw.uniforms) text << ' ' << name << '=' << value.text;
        // Only what a sampler reads: another unit may still hold what an earlier run left.
        for (auto const& [name, value] : draw.uniforms)
            if (name.find("Texture") != std::string::npos && value.numbers.size() == 1)
                if (auto const at = draw.textures.find(static_cast<int>(value.numbers[0]));
                    at != draw.textures.end())
                    text << " unit " << at->first << ' ' << Name(at->second);
        return text.str();
    }

    std::string Describe(TracedClear const& clear) {
        std::ostringstream text;
        text << "clear of " << Name(clear.target);
        AddScissor(text, clear.state);
        if (clear.clearsColor)
            for (float const component : clear.color) text << ' ' << component;
        if (clear.clearsStencil) text << " stencil " << clear.stencil << " of " << Name(clear.buffer);
        return text.str();
    }

    std::map<std::string, std::map<std::string, std::size_t>> mNames;
};

template <class... Shaders>
void Forget() {
    (ShaderManager::GetInstance()->RemoveShader(ShaderManager::Key(typeid(Shaders).name())), ...);
}

} // namespace

bool SurvivingQueue::Post(ITask* task) {
    Faults::Pause const pause;
    return HandPumpedQueue::Post(task);
}

void SurvivingQueue::Settle() {
    Faults::Pause const pause;
    for (;;) {
        try {
            RunAll();
            return;
        } catch (std::exception const&) {
        }
    }
}

void TrustFixture::SetUp() {
    SetLogSink([](LogLine const&) {}); // error lines are expected
    MKBitmapFactory_UseNativeDecoder();
    ASSERT_TRUE(SaveImage(MakeAlphaPattern(20, 90), folder.Path("picture.png")));
    RendererTrace::Reset();
    RendererTrace::SetMaxTextureSize(kMaxSide);
    ASSERT_TRUE(RendererFactory::AttachContext());
    RendererTrace::DeclareNoRenderThread();
    queue.SetAroundRun([] { RendererTrace::DeclareRenderThread(); },
                       [] { RendererTrace::DeclareNoRenderThread(); });
    RunScenario(); // whatever is made once and kept is made now
}

void TrustFixture::TearDown() {
    for (std::string const& violation : RendererTrace::GetViolations()) ADD_FAILURE() << violation;
    ForgetShaders(); // those that a leaked drawable holds die with the renderer's next reset
    RendererTrace::DeclareRenderThread();
    RendererFactory::DetachContext();
    for (std::string const& name : folder.List())
        EXPECT_EQ(name.find(".tmp"), std::string::npos) << "a save left its temporary file " << name;
    SetLogSink({});
}

void TrustFixture::ForgetShaders() {
    Forget<MKRectShader, MKLineShader, MKCircleShader, MKRoundRectShader, MKRoundRectRoundShader,
           MKBitmapShader, MKBitmapShaderColorClamp, MKBitmapAdvancedBlendingShader, MKBlenderBitmapsShader,
           MKGaussianBlurShader, MKNonPremultipliedColorShader, MKTextMaskBitmapShader>();
}

void TrustFixture::RunScenario() {
    try {
        GetParam().run({queue, [this] { queue.Settle(); }, folder.GetPath().string()});
    } catch (std::bad_alloc const&) {
    }
    queue.Settle();
}

std::vector<std::string> TrustFixture::TakeFrame() {
    RendererTrace::TakeEvents();
    RunScenario();
    FrameText text;
    std::vector<std::string> frame;
    for (TracedEvent const& event : RendererTrace::TakeEvents()) frame.push_back(text.Describe(event));
    RendererTrace::TakeCalls();
    return frame;
}

} // namespace Moka::Testing
