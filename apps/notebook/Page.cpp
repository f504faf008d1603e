#include "apps/notebook/Page.h"

#include <algorithm>
#include <cmath>
#include <utility>

namespace Moka::Notebook {
namespace {

constexpr float kMargin = 400; // below the last object

using Offset = Objects::difference_type;

Splice Invert(Splice splice) {
    std::swap(splice.removed, splice.inserted);
    return splice;
}

std::size_t CountBytes(Splice const& splice) {
    std::size_t bytes = sizeof(Splice);
    for (Objects const* const objects : {&splice.removed, &splice.inserted})
        for (ObjectPtr const& object : *objects) bytes += sizeof(ObjectPtr) + object->CountBytes();
    return bytes;
}

} // namespace

Object::Object(Stroke stroke)
    : content(std::move(stroke)), bounds(Notebook::GetBounds(std::get<Stroke>(content).points)) {}

Object::Object(Image image) : content(std::move(image)), bounds(std::get<Image>(content).place) {}

std::size_t Object::CountBytes() const {
    auto const* const stroke = std::get_if<Stroke>(&content);
    return sizeof(Object) +
           (stroke ? stroke->points.capacity() * sizeof(InkPoint) : std::get<Image>(content).file.capacity());
}

ObjectPtr Object::Move(Placement const& placement) const {
    if (auto const* const stroke = std::get_if<Stroke>(&content))
        return std::make_shared<Object const>(Stroke{placement.Apply(stroke->points), stroke->argb});
    Image image = std::get<Image>(content);
    RectF const to = placement.Apply(image.place);
    image.place = {RoundForFile(to.left), RoundForFile(to.top), RoundForFile(to.right),
                   RoundForFile(to.bottom)};
    return std::make_shared<Object const>(std::move(image));
}

RectF Splice::GetBounds() const {
    RectF bounds;
    for (Objects const* const objects : {&removed, &inserted})
        for (ObjectPtr const& object : *objects) bounds = Unite(bounds, object->bounds);
    return bounds;
}

void Page::Reset(Objects objects) {
    mObjects = std::move(objects);
    mBounds.clear();
    for (ObjectPtr const& object : mObjects) mBounds.push_back(object->bounds);
    mUndo.clear();
    mRedo.clear();
    mEdit = {};
    mDepth = 0;
    mHistoryBytes = 0;
    Measure();
}

std::vector<std::size_t> Page::Find(RectF const& area) const {
    std::vector<std::size_t> found;
    for (std::size_t i = 0; i < mBounds.size(); ++i)
        if (Overlaps(mBounds[i], area)) found.push_back(i);
    return found;
}

void Page::Measure() {
    float bottom = 0;
    for (RectF const& bounds : mBounds) bottom = std::max(bottom, bounds.bottom);
    mHeight = std::clamp(static_cast<int>(std::ceil(bottom + kMargin)), kMinHeight, kMaxHeight);
}

bool Page::Apply(Splice splice) {
    if (splice.at > mObjects.size() || splice.removed.size() > mObjects.size() - splice.at) return false;
    auto const first = mObjects.begin() + static_cast<Offset>(splice.at);
    if (!std::equal(splice.removed.begin(), splice.removed.end(), first)) return false;
    Begin();
    Change(splice);
    mEdit.bytes += CountBytes(splice);
    mEdit.splices.push_back(std::move(splice));
    End();
    return true;
}

void Page::Begin() { ++mDepth; }

void Page::End() {
    if (--mDepth > 0 || mEdit.splices.empty()) return;
    for (Edit const& edit : mRedo) mHistoryBytes -= edit.bytes;
    mRedo.clear();
    Keep(std::exchange(mEdit, {}));
}

void Page::Keep(Edit edit) {
    mHistoryBytes += edit.bytes;
    mUndo.push_back(std::move(edit));
    while (mHistoryBytes > kHistoryBytes && mUndo.size() > 1) {
        mHistoryBytes -= mUndo.front().bytes;
        mUndo.pop_front();
    }
}

void Page::Append(ObjectPtr object) { Apply({mObjects.size(), {}, {std::move(object)}}); }

void Page::Replace(std::size_t at, Objects others) { Apply({at, {mObjects[at]}, std::move(others)}); }

bool Page::Undo() {
    if (mUndo.empty() || mDepth > 0) return false;
    Edit edit = std::move(mUndo.back());
    mUndo.pop_back();
    std::for_each(edit.splices.rbegin(), edit.splices.rend(), [this](Splice const& s) { Change(Invert(s)); });
    mRedo.push_back(std::move(edit));
    return true;
}

bool Page::Redo() {
    if (mRedo.empty() || mDepth > 0) return false;
    Edit edit = std::move(mRedo.back());
    mRedo.pop_back();
    for (Splice const& splice : edit.splices) Change(splice);
    mUndo.push_back(std::move(edit));
    return true;
}

void Page::Change(Splice const& splice) {
    auto const at = static_cast<Offset>(splice.at);
    auto const end = at + static_cast<Offset>(splice.removed.size());
    mObjects.erase(mObjects.begin() + at, mObjects.begin() + end);
    mObjects.insert(mObjects.begin() + at, splice.inserted.begin(), splice.inserted.end());
    mBounds.erase(mBounds.begin() + at, mBounds.begin() + end);
    std::vector<RectF> bounds;
    for (ObjectPtr const& object : splice.inserted) bounds.push_back(object->bounds);
    mBounds.insert(mBounds.begin() + at, bounds.begin(), bounds.end());
    Measure();
    if (mListener) mListener(splice);
}

} // namespace Moka::Notebook
