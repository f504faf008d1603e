// TracingDevice: the device without a driver, with capabilities that a test sets and images that it can see.
// Thread: as NullDevice; the capabilities are set while no thread uses the renderer.
#pragma once

#include "moka/renderer/null/NullDevice.h"

namespace Moka::Testing {

class TracingDevice final : public detail::NullDevice {
public:
    using NullDevice::NullDevice;

    // What the next context reads. A size that every device of OpenGL ES 3.0 has is the default.
    static detail::DeviceCaps& Caps() {
        static detail::DeviceCaps caps = MakeCaps();
        return caps;
    }
    static detail::DeviceCaps MakeCaps() {
        return {4096, 16, "Moka", "tracing renderer", "OpenGL ES 3.0 in memory"};
    }

    detail::DeviceCaps GetCaps() const override { return Caps(); }

    // A driver may leave anything; a loud colour shows who reads it all the same.
    detail::DeviceName CreateTexture(int width, int height) override {
        detail::DeviceName const name = NullDevice::CreateTexture(width, height);
        MakeLoud({0, name, width, height, 0});
        return name;
    }

    // Rows packed, in texture order.
    std::vector<unsigned char> const& GetTexels(detail::DeviceName texture) {
        return GetImage({0, texture, 0, 0, 0}).pixels;
    }

private:
    void Execute(detail::Discard const& discard) override {
        if (discard.color) MakeLoud(discard.target);
    }
    void Execute(detail::TextureClear const& clear) override { Fill(clear.target, {0, 0, 0, 0}); }

    void MakeLoud(detail::TargetRef const& target) { Fill(target, {1, 0, 1, 1}); }
    void Fill(detail::TargetRef const& target, std::array<float, 4> const& color) {
        GetImage(target).Fill({0, 0, target.width, target.height}, color);
    }
};

} // namespace Moka::Testing
