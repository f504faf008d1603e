// GlProgram: a program object as it is handed out. Its uniforms, and through them the GL program, are
// GlUniforms's.
#pragma once

#include "moka/renderer/IShaderProgram.h"

#include <memory>

namespace Moka::detail {

class GlContext;
class GlUniforms;

class GlProgram final : public IShaderProgram {
public:
    // Inert without a context. Inside an operation, or without one.
    GlProgram(std::shared_ptr<GlContext> const& context, char const* vertexSource, char const* fragmentSource,
              char const* name);

    void MakeCurrent() override;
    void Release() override;
    IParameterBinding* GetParameter(char const* name) override;

private:
    std::shared_ptr<GlUniforms> mUniforms;
};

} // namespace Moka::detail
