// GraphicsObject: vertices of one layout. SetVertices copies them into the draw list; when the list is
// flushed, the object keeps a copy.
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
    // Call this within a request.
    GraphicsObject(std::shared_ptr<Recorder> recorder, PrimitiveType primitive,
                   VertexDescriptor const& descriptor);
    GraphicsObject(GraphicsObject const&) = delete;
    ~GraphicsObject();
    GraphicsObject& operator=(GraphicsObject const&) = delete;

    void SetVertices(int stream, void const* data, int count) override;
    bool Draw(int first, int count, int instances) override;
    void Release() override;
    void SetBounds(DrawBounds bounds) override;

    DrawBounds const& GetBounds() const { return mBounds; }
    // Call this within a request. Copies the vertices into the current list unless they are there. Throws
    // bad_alloc.
    ListVertices const& PlaceVertices();
    // Null if there are no vertices.
    float const* GetVertices() const;
    int GetStride() const { return mFloatsPerVertex; }
    // Moves the vertices from the list to the object. No draw of the list may use them.
    void TakeBackVertices() noexcept;
    // Copies the vertices before the list is cleared. If memory runs out, the object has no vertices
    // afterwards.
    void KeepVertices() noexcept;

private:
    void HandOver(float const* data, int count);
    [[gnu::cold]] void ObserveDraw(int first, int count) const;

    std::shared_ptr<Recorder> const mRecorder;
    PrimitiveType const mPrimitive;
    int const mFormat;
    int const mFloatsPerVertex;
    int mCount = 0;
    DrawBounds mBounds;
    ListVertices mPlace;
    std::uint64_t mHeldList = 0; // the list whose flush calls KeepVertices
    std::vector<float> mKept;    // the vertices while they are in no list; its capacity is reused
};

} // namespace Moka::detail
