#include "moka/graphics/bitmap/MKSharedTextureBitmap.h"

namespace Moka {

MKSharedTextureBitmap::MKSharedTextureBitmap(IGLMsgQueue* queue, IMKBitmap* parent, bool renderThread)
    : MKTextureBitmap(queue, parent->GetTextureBitmap(), parent->GetWidth(), parent->GetHeight(),
                      renderThread),
      mParent(parent) {
    mParent->Ref();
}

MKSharedTextureBitmap::~MKSharedTextureBitmap() { mParent->Unref(); }

} // namespace Moka
