// ShaderProgram: the factory's implementation of IShaderProgram. ProgramState holds the sources and values.
#pragma once

#include "moka/renderer/IShaderProgram.h"

#include <memory>

namespace Moka::detail {

class ProgramState;

class ShaderProgram final : public IShaderProgram {
public:
    explicit ShaderProgram(std::shared_ptr<ProgramState> state);

    // The program that the factory returns when memory has run out. It draws nothing and is never deleted.
    static IShaderProgram* GetInert();

    void MakeCurrent() override;
    void Release() override;
    IParameterBinding* GetParameter(char const* name) override;

    ProgramState const& GetState() const { return *mState; }

private:
    std::shared_ptr<ProgramState> const mState;
};

} // namespace Moka::detail
