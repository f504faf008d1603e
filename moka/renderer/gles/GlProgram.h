// GlProgram: a program object as it is handed out. Its uniforms, and through them the GL program, are
// GlUniforms's. A program outlives its context: it keeps its sources, and is built again where it is first
// made current in the next one. Its handles and their values stay as they are.
#pragma once

#include "moka/renderer/IShaderProgram.h"

#include <memory>
#include <string>

namespace Moka::detail {

class GlContext;
struct GlBuiltProgram;
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
    // Within an operation of the context.
    GlBuiltProgram Build(GlContext& context) const;
    void MoveTo(GlContext& context);

    std::string const mVertexSource;
    std::string const mFragmentSource;
    std::string const mName;
    std::shared_ptr<GlUniforms> mUniforms;
};

} // namespace Moka::detail
