/// IMKTextureBitmap: a bitmap made of horizontal strips, each with a texture of its own.
#pragma once

#include "moka/graphics/bitmap/IMKBitmapBufferUpdatable.h"

namespace Moka {

class IMKSubBitmap;

class IMKTextureBitmap : public IMKBitmapBufferUpdatable {
public:
    /// By position in the list of strips, top to bottom; null outside it. Not a new reference.
    virtual IMKSubBitmap* GetSubBitmap(int index) = 0;
    virtual int GetSubBitmapCount() = 0;
    virtual IMKBitmapBufferUpdatable* GetBitmapBufferUpdatable() = 0;
};

} // namespace Moka
