// GlGraphicsObject: vertices in memory; what is drawn of them is copied into the draw list.
#pragma once

#include "moka/renderer/IGraphicsObject.h"

#include <GLES3/gl3.h>

#include <memory>
#include <vector>

namespace Moka {
class VertexDescriptor;
}

namespace Moka::detail {

class GlContext;

class GlGraphicsObject final : public IGraphicsObject {
public:
    GlGraphicsObject(std::shared_ptr<GlContext> context, PrimitiveType primitive,
                     VertexDescriptor const& descriptor);
    GlGraphicsObject(GlGraphicsObject const&) = delete;
    ~GlGraphicsObject();
    GlGraphicsObject& operator=(GlGraphicsObject const&) = delete;

    void SetVertices(int stream, void const* data, int count) override;
    bool Draw(int first, int count, int instances) override;
    void Release() override { delete this; }

private:
    std::shared_ptr<GlContext> const mContext;
    PrimitiveType const mPrimitive;
    int const mFormat;
    int const mFloatsPerVertex;
    std::vector<GLfloat> mVertices; // its memory is used again, so that handing over allocates nothing
    int mCount = 0;
};

} // namespace Moka::detail
