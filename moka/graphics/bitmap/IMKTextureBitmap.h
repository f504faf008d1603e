/// IMKTextureBitmap: a bitmap made of horizontal strips, each with a texture of its own.
#pragma once

#include "moka/graphics/bitmap/IMKBitmapBufferUpdatable.h"

namespace Moka {

class IMKSubBitmap;

class IMKTextureBitmap : public IMKBitmapBufferUpdatable {
public:
    /// The strip at a position in the list, from top to bottom. Null outside the list. The caller gets no
    /// reference.
    virtual IMKSubBitmap* GetSubBitmap(int index) = 0;
    /// The number of strips.
    virtual int GetSubBitmapCount() = 0;
    /// This object, as the interface for uploads.
    virtual IMKBitmapBufferUpdatable* GetBitmapBufferUpdatable() = 0;
};

} // namespace Moka
