/// VertexDescriptor: the layout of one vertex, as a value: attributes in the order in which the vertex stage
/// declares them, tightly packed.
#pragma once

#include <array>
#include <cstddef>

namespace Moka {

/// The type of an attribute's components.
enum class VertexAttributeType { Float };

class VertexDescriptor {
public:
    /// The most attributes of a vertex.
    static constexpr int kMaxAttributes = 8;

    /// One attribute of a vertex.
    struct Attribute {
        /// The type of the components, and how many there are.
        VertexAttributeType type = VertexAttributeType::Float;
        int components = 0; ///< 1 to 4

        /// Compares all values.
        friend bool operator==(Attribute const& a, Attribute const& b) {
            return a.type == b.type && a.components == b.components;
        }
    };

    /// Adds an attribute. offset must be -1 (directly after the attribute before), and stream 0 (the only
    /// one). Returns false and adds nothing for other values, or beyond kMaxAttributes.
    bool addAttribute(VertexAttributeType type, int components, int offset, int stream) {
        bool const isKnown = components >= 1 && components <= 4 && offset == -1 && stream == 0;
        if (!isKnown || mCount == kMaxAttributes) return false;
        mAttributes[static_cast<std::size_t>(mCount++)] = {type, components};
        return true;
    }

    /// The attributes added.
    int GetAttributeCount() const { return mCount; }
    Attribute const& GetAttribute(int index) const { return mAttributes[static_cast<std::size_t>(index)]; }

    /// The number of floats of one vertex.
    int GetFloatCount() const {
        int count = 0;
        for (int i = 0; i < mCount; ++i) count += GetAttribute(i).components;
        return count;
    }

    /// Compares all values.
    friend bool operator==(VertexDescriptor const& a, VertexDescriptor const& b) {
        return a.mCount == b.mCount && a.mAttributes == b.mAttributes;
    }

private:
    std::array<Attribute, kMaxAttributes> mAttributes;
    int mCount = 0;
};

} // namespace Moka
