// Fill: fills a target with one colour by drawing, for clears that must obey the stencil test, which GL's own
// clear ignores.
// Owner:  the recorder; the program is made when it is first needed and goes with the context.
// Thread: render thread.
#pragma once

#include "moka/renderer/device/RunState.h"

#include <array>
#include <memory>

namespace Moka::detail {

class ProgramState;
class Recorder;

class Fill {
public:
    // Within a request: adds the draw to the recorder's list.
    void Add(Recorder& recorder, TargetRef const& target, std::array<float, 4> const& color);
    void Clear(Recorder& recorder);

private:
    void Make(Recorder& recorder);

    std::shared_ptr<ProgramState> mProgram;
    std::size_t mColor = 0;
    int mFormat = 0;
};

} // namespace Moka::detail
