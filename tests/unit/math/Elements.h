// Elements.h: a matrix's numbers, for comparing, and random ones.
#pragma once

#include <algorithm>
#include <cmath>
#include <random>
#include <vector>

namespace Moka::Testing {

template <class Matrix>
std::vector<float> ElementsOf(Matrix const& m) {
    return {m.data(), m.data() + sizeof(m) / sizeof(float)};
}

// The largest difference of an element, relative where the elements are large.
template <class Matrix>
float Distance(Matrix const& a, Matrix const& b) {
    float largest = 0;
    for (int i = 0; i < a.storageSize() / 4; ++i)
        largest = std::max(largest, std::abs(a[i] - b[i]) / (1 + std::abs(a[i])));
    return largest;
}

// Numbers of ordinary size, the same on every run.
class Sample {
public:
    float Next() { return static_cast<float>(static_cast<int>(mGenerator() % 20001) - 10000) / 1000.0f; }

private:
    std::mt19937 mGenerator;
};

} // namespace Moka::Testing
