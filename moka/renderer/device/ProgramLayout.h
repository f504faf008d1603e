// ProgramLayout: the uniforms of a linked program and the offset of each value in the program's block of
// values. Values are packed in the order matrices, vec4, vec2, floats, integers, texture units. A bool, an
// int and a texture unit take 4 bytes each. Up to the texture units this equals the std140 layout of a
// structure with these fields.
#pragma once

#include "moka/renderer/IParameterBinding.h"
#include "moka/renderer/device/RunState.h"

#include <string>
#include <vector>

namespace Moka::detail {

// Bytes of one value; 0 for BindingTypeUnknown.
constexpr std::size_t GetValueSize(BindingType type) {
    switch (type) {
    case BindingTypeUnknown:
        return 0;
    case BindingTypeMatrix4:
        return 16 * sizeof(float);
    case BindingTypeVector2:
        return 2 * sizeof(float);
    case BindingTypeVector4:
        return 4 * sizeof(float);
    case BindingTypeFloat:
    case BindingTypeBool:
    case BindingTypeInt:
    case BindingTypeTextureUnit:
        return 4;
    }
    return 0;
}

struct ProgramLayout {
    struct Uniform {
        std::string name;
        BindingType type;
        std::size_t offset; // bytes
        std::size_t size;   // bytes
    };

    // False if the sources do not compile or link. The program then exists and draws nothing.
    bool draws = false;
    std::vector<Uniform> uniforms;
    std::vector<std::size_t> samplers; // indices of uniforms, at most kMaxSamplers
    std::size_t size = 0;              // bytes of all values
    std::size_t integersBegin = 0;     // offset of the first int or bool, in bytes
    std::size_t integersEnd = 0;       // offset of the first texture unit, in bytes

    bool HasRoomFor(BindingType type) const {
        return type != BindingTypeTextureUnit || samplers.size() < kMaxSamplers;
    }

    void Add(char const* name, BindingType type) {
        if (type == BindingTypeTextureUnit) samplers.push_back(uniforms.size());
        uniforms.push_back({name, type, 0, GetValueSize(type)});
        Place();
    }

private:
    static bool IsInteger(BindingType type) { return type == BindingTypeInt || type == BindingTypeBool; }

    template <class Belongs>
    void PlaceThose(Belongs const& belongs) {
        for (Uniform& uniform : uniforms) {
            if (!belongs(uniform)) continue;
            uniform.offset = size;
            size += uniform.size;
        }
    }

    void Place() {
        size = 0;
        for (BindingType const type :
             {BindingTypeMatrix4, BindingTypeVector4, BindingTypeVector2, BindingTypeFloat}) {
            PlaceThose([=](Uniform const& uniform) { return uniform.type == type; });
        }
        integersBegin = size;
        PlaceThose([](Uniform const& uniform) { return IsInteger(uniform.type); });
        integersEnd = size;
        PlaceThose([](Uniform const& uniform) { return uniform.type == BindingTypeTextureUnit; });
    }
};

} // namespace Moka::detail
