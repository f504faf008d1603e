#include "moka/renderer/gles/GlGraphicsObject.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/gles/GlContext.h"

#include <algorithm>
#include <cstring>
#include <utility>

namespace Moka::detail {

GlGraphicsObject::GlGraphicsObject(std::shared_ptr<GlContext> context, PrimitiveType primitive,
                                   VertexDescriptor const& descriptor)
    : mContext(std::move(context)),
      mPrimitive(primitive),
      mFormat(mContext->vertexFormats.Find(descriptor)),
      mFloatsPerVertex(descriptor.GetFloatCount()) {
    ++mContext->statistics.graphicsObjects;
}

GlGraphicsObject::~GlGraphicsObject() { --mContext->statistics.graphicsObjects; }

void GlGraphicsObject::SetVertices(int stream, void const* data, int count) {
    mCount = 0;
    if (stream != 0 || count < 0 || (count > 0 && !data)) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "vertices are refused: stream %d (there is only 0), %d of them%s", stream, count,
                            data ? "" : ", no data");
        return;
    }
    std::size_t const floats = static_cast<std::size_t>(count) * static_cast<std::size_t>(mFloatsPerVertex);
    if (mVertices.size() < floats) mVertices.resize(floats);
    if (floats > 0) std::memcpy(mVertices.data(), data, floats * sizeof(GLfloat));
    mCount = count;
}

bool GlGraphicsObject::Draw(int first, int count, int instances) {
    GlOperation const operation(*mContext);
    if (!operation) return false;
    if (instances != 1) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log", "a draw of %d instances is refused; 1 is drawn",
                            instances);
        return false;
    }
    int const start = std::clamp(first, 0, mCount);
    int const left = mCount - start;
    GlVertices vertices;
    vertices.primitive = mPrimitive;
    vertices.format = mFormat;
    vertices.floatsPerVertex = mFloatsPerVertex;
    vertices.data = mVertices.data() + std::ptrdiff_t{start} * mFloatsPerVertex;
    vertices.count = count < 0 ? left : std::min(count, left);
    return mContext->Draw(vertices);
}

} // namespace Moka::detail
