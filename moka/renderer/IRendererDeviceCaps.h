/// IRendererDeviceCaps: the device's capabilities, read once when the context is attached.
/// Thread: any; makes no GL call.
/// The vtable order is ABI: the destructor, then GetMaxTextureSize.
#pragma once

namespace Moka {

class IRendererDeviceCaps {
public:
    virtual ~IRendererDeviceCaps() = default;

    /// The largest texture side in texels, lowered by RendererLimits; 4096 before a context exists.
    virtual int GetMaxTextureSize() const = 0;

    /// The driver's own strings; empty before a context exists. Valid for the life of the process.
    virtual char const* GetVendor() const = 0;
    virtual char const* GetRenderer() const = 0;
    virtual char const* GetVersion() const = 0;
};

} // namespace Moka
