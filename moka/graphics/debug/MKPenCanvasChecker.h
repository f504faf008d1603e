/// MKPenCanvasChecker: a pen canvas that forwards every call to another one while it is referenced, and
/// throws "Canvas was already released!!" afterwards. Owner, Thread, Fails: see Checker.h.
/// GetMatrix ends the process, as a call to a pure virtual function does; GetBitmap forwards.
///
// Compat: checker-pure
#pragma once

#include "moka/graphics/canvas/IMKPenCanvas.h"
#include "moka/graphics/debug/CanvasChecker.h"

namespace Moka {

class MOKA_API MKPenCanvasChecker final : public detail::CanvasChecker<IMKPenCanvas> {
public:
    explicit MKPenCanvasChecker(IMKPenCanvas* canvas); ///< not null, not owned
    ~MKPenCanvasChecker() override;

    /// Forwards while referenced.
    IMKBitmap* GetBitmap() override { return Checked().GetBitmap(); }

    Matrix3<float> GetModelMatrix() override { return Checked().GetModelMatrix(); }
    Matrix4<float> GetCanvasMatrix() override { return Checked().GetCanvasMatrix(); }
    void EnableClipRT(int frameBuffer) override { Checked().EnableClipRT(frameBuffer); }
    void DisableClipRT() override { Checked().DisableClipRT(); }
};

} // namespace Moka
