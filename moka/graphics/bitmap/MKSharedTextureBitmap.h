// MKSharedTextureBitmap: a texture bitmap that shares the image of another one, its parent. Drawing into one
// of them changes both. Each has its own sampling state. It holds a reference on its parent.
#pragma once

#include "moka/graphics/bitmap/MKTextureBitmap.h"

namespace Moka {

class MOKA_API MKSharedTextureBitmap : public MKTextureBitmap {
public:
    // parent must be a texture bitmap; the factory checks this.
    MKSharedTextureBitmap(IGLMsgQueue* queue, IMKBitmap* parent, bool renderThread);
    ~MKSharedTextureBitmap() override;

private:
    IMKBitmap* mParent; // one reference
};

} // namespace Moka
