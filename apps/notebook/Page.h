// Page: the document: a list of objects, the lowest first, and how it has changed. Pixels are made from it.
// Owner:   objects are shared and never change; an edit puts others in their place.
// Thread:  one, like any value. A copy of the objects may go to another thread.
// Units:   pixels of the page, 1200 wide, origin top left, y down.
// Undo:    each edit is kept, without a limit of their number, until the objects that the edits name are larger
//          than kHistoryBytes; then the oldest edits go.
#pragma once

#include "apps/notebook/Ink.h"

#include <cstddef>
#include <deque>
#include <functional>
#include <memory>
#include <string>
#include <variant>
#include <vector>

namespace Moka::Notebook {

struct Stroke {
    InkPoints points;
    unsigned argb = 0xFF000000;
};

struct Image {
    std::string file; // its full path
    RectF place;
};

struct Object {
    explicit Object(Stroke stroke);
    explicit Object(Image image);

    std::size_t CountBytes() const;
    std::shared_ptr<Object const> Move(Placement const& placement) const;

    std::variant<Stroke, Image> content;
    RectF bounds;
};
using ObjectPtr = std::shared_ptr<Object const>;
using Objects = std::vector<ObjectPtr>;

// Objects from `at` on are taken out, and others put there.
struct Splice {
    std::size_t at = 0;
    Objects removed;
    Objects inserted;

    RectF GetBounds() const;
};

class Page {
public:
    static constexpr int kWidth = 1200;
    static constexpr int kMinHeight = 1600;
    static constexpr int kMaxHeight = 1'000'000;
    static constexpr std::size_t kHistoryBytes = std::size_t{64} << 20;

    // Called after each splice, those of undo and redo among them.
    using Listener = std::function<void(Splice const&)>;
    explicit Page(Listener listener = {}) : mListener(std::move(listener)) {}

    // In the place of everything, without a way back and without a call.
    void Reset(Objects objects);

    Objects const& GetObjects() const { return mObjects; }
    // Positions of those whose bounds overlap the area, the lowest first.
    std::vector<std::size_t> Find(RectF const& area) const;
    // As long as what is on it, a margin below, and at least kMinHeight.
    int GetHeight() const { return mHeight; }

    // Applies a splice whose `removed` are there; what is false is refused. Between Begin and End all of them are
    // one edit.
    bool Apply(Splice splice);
    void Begin();
    void End();
    void Append(ObjectPtr object);
    void Replace(std::size_t at, Objects others);

    bool CanUndo() const { return !mUndo.empty(); }
    bool CanRedo() const { return !mRedo.empty(); }
    bool Undo();
    bool Redo();
    std::size_t CountHistoryBytes() const { return mHistoryBytes; }

private:
    struct Edit {
        std::vector<Splice> splices;
        std::size_t bytes = 0;
    };

    void Change(Splice const& splice);
    void Keep(Edit edit);
    void Measure();

    Listener mListener;
    Objects mObjects;
    std::vector<RectF> mBounds; // of mObjects, together in memory: Find looks at all of them
    int mHeight = kMinHeight;
    int mDepth = 0; // of Begin
    Edit mEdit;     // since Begin
    std::deque<Edit> mUndo;
    std::vector<Edit> mRedo;
    std::size_t mHistoryBytes = 0;
};

} // namespace Moka::Notebook
