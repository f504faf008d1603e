// ShaderProgram: a program as the factory hands it out; ProgramState has its texts and values.
#pragma once

#include "moka/renderer/IShaderProgram.h"

#include <memory>

namespace Moka::detail {

class ProgramState;

class ShaderProgram final : public IShaderProgram {
public:
    explicit ShaderProgram(std::shared_ptr<ProgramState> state);

    // What the factory gives when memory has run out: it draws nothing and is never deleted.
    static IShaderProgram* GetInert();

    void MakeCurrent() override;
    void Release() override;
    IParameterBinding* GetParameter(char const* name) override;

    ProgramState const& GetState() const { return *mState; }

private:
    std::shared_ptr<ProgramState> const mState;
};

} // namespace Moka::detail
