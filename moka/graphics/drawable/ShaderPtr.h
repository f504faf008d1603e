// ShaderPtr: one use of a program, given back to the shader manager.
// Thread: render thread.
#pragma once

#include "moka/graphics/drawable/ShaderManager.h"

#include <memory>

namespace Moka::detail {

template <class Shader>
struct GiveShaderBack {
    void operator()(Shader* shader) const { ShaderManager::GetInstance()->ReleaseShader(shader); }
};

template <class Shader>
using ShaderPtr = std::unique_ptr<Shader, GiveShaderBack<Shader>>;

// As ShaderManager::GetShader: null when memory ran out; exceptions of the shader's constructor pass.
template <class Shader>
ShaderPtr<Shader> GetShader() {
    return ShaderPtr<Shader>(ShaderManager::GetInstance()->GetShader<Shader>());
}

} // namespace Moka::detail
