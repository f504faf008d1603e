/// CanvasChecker: the common part of the checkers of both kinds of canvas; see Checker.
#pragma once

#include "moka/graphics/canvas/IMKCanvasBase.h"
#include "moka/graphics/debug/Checker.h"

namespace Moka::detail {

/// Ends the process in the way of a call to a pure virtual function.
[[noreturn]] MOKA_API void EndAsPureVirtual();

template <class Interface>
class MOKA_API CanvasChecker : public Checker<Interface> {
public:
    /// As IMKCanvasBase.
    using ClipOp = IMKCanvasBase::ClipOp;
    using SaveFlag = IMKCanvasBase::SaveFlag;

    /// Forwards while referenced.
    void Clear(int argb) override { Checked().Clear(argb); }
    void Clear(float r, float g, float b, float a) override { Checked().Clear(r, g, b, a); }
    void ClearAll(int argb) override { Checked().ClearAll(argb); }
    void ClearAll(float r, float g, float b, float a) override { Checked().ClearAll(r, g, b, a); }

    /// Forwards while referenced.
    int Save(SaveFlag flag) override { return Checked().Save(flag); }
    void Restore(int level) override { Checked().Restore(level); }
    void SetClipRect(int x, int y, int width, int height, ClipOp op) override {
        Checked().SetClipRect(x, y, width, height, op);
    }

    /// Forwards while referenced.
    void SetMatrix(Matrix3<float> const& m) override { Checked().SetMatrix(m); }
    /// Ends the process.
    // Compat: checker-pure
    Matrix3<float> GetMatrix() override { EndAsPureVirtual(); }
    /// Forwards while referenced.
    void PreConcat(Matrix3<float> const& m) override { Checked().PreConcat(m); }
    void PostConcat(Matrix3<float> const& m) override { Checked().PostConcat(m); }
    void PreScale(float sx, float sy) override { Checked().PreScale(sx, sy); }
    void PostScale(float sx, float sy) override { Checked().PostScale(sx, sy); }
    void PreRotate(float degrees) override { Checked().PreRotate(degrees); }
    void PreRotate(float degrees, float px, float py) override { Checked().PreRotate(degrees, px, py); }
    void PostRotate(float degrees) override { Checked().PostRotate(degrees); }
    void PostRotate(float degrees, float px, float py) override { Checked().PostRotate(degrees, px, py); }
    void PreTranslate(float tx, float ty) override { Checked().PreTranslate(tx, ty); }
    void PostTranslate(float tx, float ty) override { Checked().PostTranslate(tx, ty); }

    /// The tag set through the checker, not the canvas's own.
    // Compat: checker-tag
    char const* GetTag() override {
        this->checkRefCount();
        return this->GetOwnTag();
    }

protected:
    using Checker<Interface>::Checker;
    using Checker<Interface>::Checked;
};

} // namespace Moka::detail
