// Journey: takes an image file through the loader onto the GPU, paints on it, and saves it.
// Thread: one, which waits; not the loader's.
#pragma once

#include "moka/base/RefPtr.h"
#include "moka/base/String.h"
#include "moka/graphics/bitmap/IMKBitmap.h"

#include <future>
#include <jni.h>
#include <string>

namespace Moka {
class RenderThread;
}

namespace Moka::Testing {

class Journey {
public:
    explicit Journey(JavaVM* vm) : mVm(vm) {}

    // The name of the Java thread that the loader called back on; "!" and what went wrong otherwise.
    std::string Travel(String const& from, String const& to);

private:
    std::string GetJavaThreadName() const;
    std::string LoadDrawSave(RenderThread& queue, String const& from, String const& to);
    std::string Draw(RenderThread& queue);

    JavaVM* const mVm;
    RefPtr<IMKBitmap> mBitmap;
    std::string mThreadName;
};

} // namespace Moka::Testing
