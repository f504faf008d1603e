// Fill: clears a target to one colour by drawing. A clear under a stencil clip needs it, because glClear
// ignores the stencil test.
// Owner:  the recorder. The program is created at the first use and deleted with the context.
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
