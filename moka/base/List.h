/// List: an ordered list of pointers. It does not own the objects.
/// Cost:   adding at the end and removing at either end are amortised O(1), so it can be used as a queue.
///         Removing elsewhere moves the following items. A list that was never filled has allocated nothing.
/// Thread: not synchronised.
/// Fails:  nothing throws.
#pragma once

#include <algorithm>
#include <cstddef>
#include <exception>
#include <vector>

namespace Moka {

template <class T>
class List {
public:
    /// Completes the construction. Call it once. Always returns true.
    bool Construct() { return true; }

    /// The number of items.
    int GetCount() const { return static_cast<int>(mItems.size() - mTaken); }
    /// True without items.
    bool IsEmpty() const { return GetCount() == 0; }

    /// The item at index; null if index is outside 0 ... count - 1.
    T* GetAt(int index) const {
        std::size_t const at = mTaken + static_cast<std::size_t>(index);
        return index >= 0 && at < mItems.size() ? mItems[at] : nullptr;
    }

    /// Appends an item. Returns false and changes nothing if memory runs out.
    [[nodiscard]] bool Add(T* item) {
        try {
            mItems.push_back(item);
            return true;
        } catch (std::exception const&) {
            return false;
        }
    }

    /// Removes and returns the item at index; null if index is outside 0 ... count - 1.
    T* RemoveAt(int index) {
        if (index < 0 || index >= GetCount()) return nullptr;
        auto const at = Begin() + index;
        T* const item = *at;
        Erase(at);
        return item;
    }

    /// Removes the first occurrence of item. Returns false if there is none.
    bool Remove(T const* item) {
        auto const at = std::find(Begin(), mItems.end(), item);
        if (at == mItems.end()) return false;
        Erase(at);
        return true;
    }

    /// Removes all items.
    void Clear() {
        mItems.clear();
        mTaken = 0;
    }

private:
    using Position = typename std::vector<T*>::iterator;

    Position Begin() { return mItems.begin() + static_cast<std::ptrdiff_t>(mTaken); }

    void Erase(Position at) {
        if (at != Begin()) {
            mItems.erase(at);
            return;
        }
        ++mTaken;
        // Moving the items only if at least half of the entries are removed ones keeps this O(1) on average.
        if (mTaken * 2 < mItems.size()) return;
        mItems.erase(mItems.begin(), Begin());
        mTaken = 0;
    }

    std::vector<T*> mItems;
    std::size_t mTaken = 0; // entries at the front that were removed
};

} // namespace Moka
