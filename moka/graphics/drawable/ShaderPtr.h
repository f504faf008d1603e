// ShaderPtr: a shared shader, released to the shader manager in the destructor.
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

// Like ShaderManager::GetShader: returns null if memory runs out; exceptions of the shader's constructor pass
// through.
template <class Shader>
ShaderPtr<Shader> GetShader() {
    return ShaderPtr<Shader>(ShaderManager::GetInstance()->GetShader<Shader>());
}

} // namespace Moka::detail
