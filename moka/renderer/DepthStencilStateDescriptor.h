/// DepthStencilStateDescriptor: the depth and stencil tests of both faces, as a value.
/// By default the stencil test, if on, always passes and keeps the stored value. The depth test, if on,
/// passes nearer fragments and writes their depth.
#pragma once

namespace Moka {

/// The numbers are the interface.
enum StencilComparison { StencilEqual = 2, StencilNotEqual = 5, StencilAlways = 7 };

/// The change of the stored stencil value.
enum StencilOperation {
    StencilKeep = 0,
    StencilZero = 1,
    StencilReplace = 2,
    StencilIncrementSaturate = 3,
    StencilDecrementSaturate = 4,
};

class DepthStencilStateDescriptor {
public:
    /// Whether to test depth and stencil.
    DepthStencilStateDescriptor(bool depth, bool stencil) : mDepth(depth), mStencil(stencil) {}

    /// Passes where (reference & readMask) compares to (stored value & readMask); writeMask says which bits
    /// an operation may change.
    void SetStencilFunction(StencilComparison comparison, int reference, unsigned readMask,
                            unsigned writeMask) {
        mComparison = comparison;
        mReference = reference;
        mReadMask = readMask;
        mWriteMask = writeMask;
    }
    /// The change of the stored value where the stencil test fails, where the depth test fails, and where
    /// both pass.
    void SetStencilOperation(StencilOperation stencilFail, StencilOperation depthFail,
                             StencilOperation pass) {
        mStencilFail = stencilFail;
        mDepthFail = depthFail;
        mPass = pass;
    }

    /// The values set.
    bool IsDepth() const { return mDepth; }
    bool IsStencil() const { return mStencil; }
    StencilComparison GetComparison() const { return mComparison; }
    int GetReference() const { return mReference; }
    unsigned GetReadMask() const { return mReadMask; }
    unsigned GetWriteMask() const { return mWriteMask; }
    StencilOperation GetStencilFail() const { return mStencilFail; }
    StencilOperation GetDepthFail() const { return mDepthFail; }
    StencilOperation GetPass() const { return mPass; }

    /// Compares all values. If the stencil test is off in both, its other values are ignored.
    friend bool operator==(DepthStencilStateDescriptor const& a, DepthStencilStateDescriptor const& b) {
        if (a.mDepth != b.mDepth || a.mStencil != b.mStencil) return false;
        return !a.mStencil || a.HasStencilOf(b);
    }

private:
    bool HasStencilOf(DepthStencilStateDescriptor const& b) const {
        DepthStencilStateDescriptor const& a = *this;
        return a.mComparison == b.mComparison && a.mReference == b.mReference && a.mReadMask == b.mReadMask &&
               a.mWriteMask == b.mWriteMask && a.mStencilFail == b.mStencilFail &&
               a.mDepthFail == b.mDepthFail && a.mPass == b.mPass;
    }

    bool mDepth;
    bool mStencil;
    StencilComparison mComparison = StencilAlways;
    int mReference = 0;
    unsigned mReadMask = 0xFF;
    unsigned mWriteMask = 0xFF;
    StencilOperation mStencilFail = StencilKeep;
    StencilOperation mDepthFail = StencilKeep;
    StencilOperation mPass = StencilKeep;
};

} // namespace Moka
