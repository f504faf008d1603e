/// List: an ordered list of pointers that it does not own.
/// Cost:   adding at the end and removing at either end are amortised O(1), so it serves as a queue; removing
///         elsewhere moves what follows. An empty list that was never filled has allocated nothing.
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
    /// Completes construction; false without memory. May be called once.
    bool Construct() { return true; }

    /// The number of items.
    int GetCount() const { return static_cast<int>(mItems.size() - mTaken); }
    /// True without items.
    bool IsEmpty() const { return GetCount() == 0; }

    /// Null when index is outside 0 ... count - 1.
    T* GetAt(int index) const {
        std::size_t const at = mTaken + static_cast<std::size_t>(index);
        return index >= 0 && at < mItems.size() ? mItems[at] : nullptr;
    }

    /// False, with the list unchanged, without memory for the item.
    [[nodiscard]] bool Add(T* item) {
        try {
            mItems.push_back(item);
            return true;
        } catch (std::exception const&) {
            return false;
        }
    }

    /// Takes the item out and returns it; null when index is outside 0 ... count - 1.
    T* RemoveAt(int index) {
        if (index < 0 || index >= GetCount()) return nullptr;
        auto const at = Begin() + index;
        T* const item = *at;
        Erase(at);
        return item;
    }

    /// Removes the first occurrence; false when there is none.
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
        // Moving the rest up only when it is the smaller half keeps a removal at the front O(1) on average.
        if (mTaken * 2 < mItems.size()) return;
        mItems.erase(mItems.begin(), Begin());
        mTaken = 0;
    }

    std::vector<T*> mItems;
    std::size_t mTaken = 0; // entries at the front that were removed
};

} // namespace Moka
