// Reference.h: matrices in double precision by the schoolbook, to hold the library's against, and the random
// numbers both are fed.
#pragma once

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <random>
#include <vector>

namespace Moka::Testing {

inline std::uint32_t Bits(float value) {
    std::uint32_t bits;
    std::memcpy(&bits, &value, sizeof(bits));
    return bits;
}

template <class Matrix>
std::vector<float> ElementsOf(Matrix const& m) {
    return {m.data(), m.data() + sizeof(m) / sizeof(float)};
}

// Numbers of ordinary size, the same on every run.
class Sample {
public:
    explicit Sample(unsigned seed) : mGenerator(seed) {}
    float Next() { return static_cast<float>(static_cast<int>(mGenerator() % 20001) - 10000) / 1000.0f; }
    template <class Matrix>
    Matrix NextMatrix() {
        Matrix m;
        for (int i = 0; i < m.storageSize() / 4; ++i) m[i] = Next();
        return m;
    }

private:
    std::mt19937 mGenerator;
};

// N x N, rows first, which is not how the library stores them.
template <int N>
struct Reference {
    double at[N][N] = {};

    Reference() = default;
    template <class Matrix>
    explicit Reference(Matrix const& m) {
        for (int row = 0; row < N; ++row) {
            for (int column = 0; column < N; ++column) at[row][column] = double(m.data()[column * N + row]);
        }
    }

    Reference Times(Reference const& right) const {
        Reference result;
        for (int row = 0; row < N; ++row) {
            for (int column = 0; column < N; ++column) {
                for (int k = 0; k < N; ++k) result.at[row][column] += at[row][k] * right.at[k][column];
            }
        }
        return result;
    }

    // The largest difference of an element, relative where the elements are large.
    template <class Matrix>
    double Distance(Matrix const& m) const {
        Reference const other(m);
        double largest = 0;
        for (int row = 0; row < N; ++row) {
            for (int column = 0; column < N; ++column) {
                double const difference = std::abs(at[row][column] - other.at[row][column]);
                largest = std::max(largest, difference / (1 + std::abs(at[row][column])));
            }
        }
        return largest;
    }
};

} // namespace Moka::Testing
