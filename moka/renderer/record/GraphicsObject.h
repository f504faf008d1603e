// GraphicsObject: vertices of one layout. They lie in the draw list from the hand-over on, and in memory of the
// object once the list was flushed.
#pragma once

#include "moka/renderer/IGraphicsObject.h"
#include "moka/renderer/record/DrawListBuilder.h"

#include <memory>
#include <vector>

namespace Moka {
class VertexDescriptor;
}

namespace Moka::detail {

class Recorder;

class GraphicsObject final : public IGraphicsObject {
public:
    // Within a request.
    GraphicsObject(std::shared_ptr<Recorder> recorder, PrimitiveType primitive,
                   VertexDescriptor const& descriptor);
    GraphicsObject(GraphicsObject const&) = delete;
    ~GraphicsObject();
    GraphicsObject& operator=(GraphicsObject const&) = delete;

    void SetVertices(int stream, void const* data, int count) override;
    bool Draw(int first, int count, int instances) override;
    void Release() override;
    void SetBounds(DrawBounds const& bounds) override;

    DrawBounds const& GetBounds() const { return mBounds; }
    // Within a request: the vertices in the present list. Throws bad_alloc.
    ListVertices const& PlaceVertices();
    // Null without vertices.
    float const* GetVertices() const;
    int GetStride() const { return mFloatsPerVertex; }
    // The list does not need the vertices; the object keeps them.
    void TakeBackVertices() noexcept;
    // The list is about to be cleared. Without memory the object has no vertices afterwards.
    void KeepVertices() noexcept;

private:
    void HandOver(float const* data, int count);

    std::shared_ptr<Recorder> const mRecorder;
    PrimitiveType const mPrimitive;
    int const mFormat;
    int const mFloatsPerVertex;
    int mCount = 0;
    DrawBounds mBounds;
    ListVertices mPlace;
    std::uint64_t mHeldList = 0; // the list that calls KeepVertices
    std::vector<float> mKept;    // used while the list does not have them; its memory is used again
};

} // namespace Moka::detail
