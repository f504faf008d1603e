// GlRasterizer: the scissor test as it is handed out.
#pragma once

#include "moka/renderer/IRasterizerState.h"

namespace Moka::detail {

// Of whatever context is attached; without one it remembers nothing.
class GlRasterizer final : public IRasterizerState {
public:
    bool IsScissorEnabled() override;
    void SetScissorEnabled(bool on) override;
    ScissorRect GetScissorRect() override;
    void SetScissorRect(ScissorRect const& rect) override;
};

} // namespace Moka::detail
