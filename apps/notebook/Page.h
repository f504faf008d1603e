// Page: the model: a list of objects, the lowest first, and its history of edits.
// Owner:   objects are shared and immutable; an edit replaces them.
// Thread:  one at a time. Another thread may use a copy of the objects.
// Units:   pixels of the page, 1200 wide, origin top left, y down.
// Undo:    the number of edits is not limited. If the objects of all edits are larger than kHistoryBytes, the oldest
//          edits are dropped.
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

// Replaces `removed`, which begin at index `at`, by `inserted`.
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

    // Called after each splice, including those of undo and redo.
    using Listener = std::function<void(Splice const&)>;
    explicit Page(Listener listener = {}) : mListener(std::move(listener)) {}

    // Replaces all objects and clears the history. Does not call the listener.
    void Reset(Objects objects);

    Objects const& GetObjects() const { return mObjects; }
    // Returns the indices of the objects whose bounds overlap the area, the lowest first.
    std::vector<std::size_t> Find(RectF const& area) const;
    // The height of the content and a margin below, at least kMinHeight.
    int GetHeight() const { return mHeight; }

    // Applies a splice. Returns false and changes nothing if `removed` are not the objects at `at`. All splices between
    // Begin and End form one edit.
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
    std::vector<RectF> mBounds; // of mObjects, contiguous in memory because Find reads all of them
    int mHeight = kMinHeight;
    int mDepth = 0; // calls of Begin without End
    Edit mEdit;     // the splices since Begin
    std::deque<Edit> mUndo;
    std::vector<Edit> mRedo;
    std::size_t mHistoryBytes = 0;
};

} // namespace Moka::Notebook
