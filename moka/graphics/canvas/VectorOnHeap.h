// VectorOnHeap.h: copies vectors for requests, which own the copies.
#pragma once

#include <memory>
#include <new>
#include <vector>

namespace Moka::detail {

// Returns a vector with one converted element for each of source. Returns null if memory runs out.
template <class T, class Source, class Convert>
std::unique_ptr<std::vector<T>> NewVector(Source const& source, Convert const& convert) noexcept try {
    auto result = std::make_unique<std::vector<T>>();
    result->reserve(source.size());
    for (auto const& element : source) result->push_back(convert(element));
    return result;
} catch (std::bad_alloc const&) {
    return nullptr;
}

template <class T>
std::unique_ptr<std::vector<T>> CopyVector(std::vector<T> const& source) noexcept try {
    return std::make_unique<std::vector<T>>(source);
} catch (std::bad_alloc const&) {
    return nullptr;
}

} // namespace Moka::detail
