// StateObjects.h: the factory's blend state, depth-stencil state and rasterizer state (scissor). Each sets
// its member of RequestedState.
#pragma once

#include "moka/renderer/IBlendStateObject.h"
#include "moka/renderer/IDepthStencilState.h"
#include "moka/renderer/IRasterizerState.h"

#include <memory>

namespace Moka::detail {

class Recorder;

// Interface: IBlendStateObject or IDepthStencilState.
template <class Interface, class Descriptor>
class StateObject final : public Interface {
public:
    StateObject(std::shared_ptr<Recorder> recorder, Descriptor const& descriptor);
    StateObject(StateObject const&) = delete;
    ~StateObject();
    StateObject& operator=(StateObject const&) = delete;

    void SetDescriptor(Descriptor const& descriptor) override;
    void Apply() override;
    void Release() override;

private:
    std::shared_ptr<Recorder> const mRecorder;
    Descriptor mDescriptor;
};

using BlendState = StateObject<IBlendStateObject, BlendStateDescriptor>;
using DepthStencilState = StateObject<IDepthStencilState, DepthStencilStateDescriptor>;
extern template class StateObject<IBlendStateObject, BlendStateDescriptor>;
extern template class StateObject<IDepthStencilState, DepthStencilStateDescriptor>;

// Sets the scissor of the attached context. Without a context, calls do nothing.
class RasterizerState final : public IRasterizerState {
public:
    bool IsScissorEnabled() override;
    void SetScissorEnabled(bool on) override;
    ScissorRect GetScissorRect() override;
    void SetScissorRect(ScissorRect const& rect) override;
};

} // namespace Moka::detail
