// MKSharedTextureBitmap: a texture bitmap over another one's image. Drawing into either shows in both;
// sampling state is each one's own. It keeps its parent alive for its whole life.
#pragma once

#include "moka/graphics/bitmap/MKTextureBitmap.h"

namespace Moka {

class MOKA_API MKSharedTextureBitmap : public MKTextureBitmap {
public:
    // parent has a texture bitmap; the factory has looked.
    MKSharedTextureBitmap(IGLMsgQueue* queue, IMKBitmap* parent, bool renderThread);
    ~MKSharedTextureBitmap() override;

private:
    IMKBitmap* mParent; // one reference
};

} // namespace Moka
