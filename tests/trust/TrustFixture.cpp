#include "tests/trust/TrustFixture.h"

#include "moka/base/log/LogSink.h"
#include "moka/graphics/bitmap/ImageDecoding.h"
#include "moka/graphics/drawable/ShaderManager.h"
#include "moka/graphics/drawable/Shaders.h"
#include "moka/renderer/RendererFactory.h"
#include "tests/support/RendererTrace.h"
#include "tests/support/TestImages.h"
#include "tests/trust/Faults.h"

#include <algorithm>
#include <cctype>
#include <exception>
#include <new>
#include <sstream>
#include <typeinfo>

namespace Moka::Testing {
namespace {

// "target 17" is another one in each run.
std::string WithoutNumbers(std::string const& call) {
    std::istringstream words(call);
    std::string word, text;
    for (bool isObject = false; words >> word;
         isObject = std::isalpha(static_cast<unsigned char>(word[0])) != 0)
        if (!isObject || !std::isdigit(static_cast<unsigned char>(word[0]))) text += word + ' ';
    return text;
}

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
    RendererTrace::TakeCalls();
    RunScenario();
    std::vector<std::string> frame = RendererTrace::TakeCalls();
    for (std::string& call : frame) call = WithoutNumbers(call);
    // Of two threads' calls no order is certain.
    if (GetParam().name == GetLoaderScenario().name) std::sort(frame.begin(), frame.end());
    return frame;
}

} // namespace Moka::Testing
