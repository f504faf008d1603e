/// Checker: wraps an object and counts the references taken through it. A use after the last Unref throws,
/// instead of reading freed memory. It is a debugging aid: pass the checker to code that you suspect, in
/// place of the object. The library itself creates no checkers.
///
///     MKBitmapChecker     Checker<IMKBitmap>
///     MKCanvasChecker     CanvasChecker<IMKCanvas>, over Checker<IMKCanvas>
///     MKPenCanvasChecker  CanvasChecker<IMKPenCanvas>, over Checker<IMKPenCanvas>
///
/// Owner:  the creator deletes it. It holds no reference on the object. It stays alive when its count is
///         zero, so that it can report later uses. The count starts at one.
/// Thread: as for the object. Counting is atomic, but a use that races with the last Unref may still pass.
/// Fails:  with a count of zero every operation logs the object's address and the tag, throws
///         std::logic_error, and does not touch the object.
#pragma once

#include "moka/base/CriticalSection.h"
#include "moka/base/Export.h"
#include "moka/base/Tag.h"

#include <atomic>

namespace Moka {

class IGLMsgQueue;
class IMKBitmap;
class IMKCanvasBase;

namespace detail {

/// Log an error and throw. They do not touch the object.
[[noreturn]] MOKA_API void FailReleased(IMKBitmap const* bitmap, char const* tag, int refCount);
[[noreturn]] MOKA_API void FailReleased(IMKCanvasBase const* canvas, char const* tag, int refCount);

template <class Interface>
class MOKA_API Checker : public Interface {
public:
    /// Fails unless the count is above zero.
    void checkRefCount() const {
        if (int const count = mRefCount; count <= 0) FailReleased(mWrapped, mTag.Get(), count);
    }

    /// Forwards the whole tag; the checker keeps the first 126 bytes for its own messages.
    void SetTag(char const* tag) override {
        checkRefCount();
        mTag.Set(tag);
        mWrapped->SetTag(tag);
    }

    /// Forwards while referenced.
    IGLMsgQueue* GetMsgQueue() override { return Checked().GetMsgQueue(); }

    /// Change the count, then forward without the lock, because the last Unref may delete the object and run
    /// other code.
    int Ref() override {
        ChangeCount(1);
        return mWrapped->Ref();
    }
    int Unref() override {
        ChangeCount(-1);
        return mWrapped->Unref();
    }

protected:
    /// wrapped must not be null. The checker does not own it.
    explicit Checker(Interface* wrapped) : mLock(false), mWrapped(wrapped) {}

    /// The object, after checking the count.
    Interface& Checked() const {
        checkRefCount();
        return *mWrapped;
    }

    /// The tag set through the checker.
    char const* GetOwnTag() const { return mTag.Get(); }

private:
    // Check and change are one step, so of two simultaneous last Unrefs only one passes.
    void ChangeCount(int by) {
        AutoCriticalSection const lock(mLock);
        checkRefCount();
        mRefCount += by;
    }

    CriticalSection mLock; // held to change the count, not to read it
    Interface* const mWrapped;
    Tag mTag;
    std::atomic<int> mRefCount{1};
};

} // namespace detail
} // namespace Moka
