// MKBitmap: the common part of all bitmaps: the queue, the rectangle, the tag and the reference count. It
// supports no capability; derived classes add theirs.
#pragma once

#include "moka/base/Export.h"
#include "moka/base/RefCount.h"
#include "moka/base/Tag.h"
#include "moka/graphics/bitmap/IMKBitmap.h"

namespace Moka {

class MOKA_API MKBitmap : public IMKBitmap, public RefCount {
public:
    // The frame buffer of the host that a screen bitmap draws into.
    enum FramebufferType : int { DefaultFramebuffer = 0, CurrentFramebuffer = -1 };

    MKBitmap(IGLMsgQueue* queue, int x, int y, int width, int height);

    int GetX() const override { return mBitmapRect.left; }
    int GetY() const override { return mBitmapRect.top; }
    int GetWidth() const override { return mBitmapRect.GetWidth(); }
    int GetHeight() const override { return mBitmapRect.GetHeight(); }
    Rect GetBitmapRect() override { return mBitmapRect; }

    void SetTag(char const* tag) override { mTag.Set(tag); }
    char const* GetTag() override { return mTag.Get(); }

    IGLMsgQueue* GetMsgQueue() override { return mMsgQueue; }

    int Ref() override { return RefCount::Ref(); }
    int Unref() override { return RefCount::Unref(); }

    IMKBitmapReadable* GetBitmapReadable() override { return nullptr; }
    IMKBitmapWritable* GetBitmapWritable() override { return nullptr; }
    IMKBitmapCanvasAttachable* GetBitmapCanvasAttachable() override { return nullptr; }
    IMKTextureBitmap* GetTextureBitmap() override { return nullptr; }

protected:
    IGLMsgQueue* const mMsgQueue; // not owned

private:
    Rect const mBitmapRect;
    Tag mTag;
};

} // namespace Moka
