/// Checker: wraps an object and counts the references that go through it. A use after the last Unref fails
/// here, and not in freed memory. A debugging aid: code that suspects such a use hands out the checker
/// instead of the object; the library itself creates none.
///
///     MKBitmapChecker     Checker<IMKBitmap>
///     MKCanvasChecker     CanvasChecker<IMKCanvas>, over Checker<IMKCanvas>
///     MKPenCanvasChecker  CanvasChecker<IMKPenCanvas>, over Checker<IMKPenCanvas>
///
/// Owner:  the creator deletes it. It holds none of the object's references, and stays alive at a count of
///         zero, to refuse. Its own count starts at one.
/// Thread: the object's own rules. Counting is exact from any thread, but a use that races with the last
///         Unref may still get through.
/// Fails:  with a count of zero every operation leaves the object alone, logs its address and the tag, and
///         throws std::logic_error.
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

/// Log the line and throw; neither touches the object.
[[noreturn]] MOKA_API void FailReleased(IMKBitmap const* bitmap, char const* tag, int refCount);
[[noreturn]] MOKA_API void FailReleased(IMKCanvasBase const* canvas, char const* tag, int refCount);

template <class Interface>
class MOKA_API Checker : public Interface {
public:
    /// Fails unless the count is above zero.
    void checkRefCount() const {
        if (int const count = mRefCount; count <= 0) FailReleased(mWrapped, mTag.Get(), count);
    }

    /// The object gets the whole tag; the checker keeps the first 126 bytes for its own messages.
    void SetTag(char const* tag) override {
        checkRefCount();
        mTag.Set(tag);
        mWrapped->SetTag(tag);
    }

    /// Forwards while referenced.
    IGLMsgQueue* GetMsgQueue() override { return Checked().GetMsgQueue(); }

    /// Forwards without the lock: the last reference may delete the object and run other code.
    int Ref() override {
        ChangeCount(1);
        return mWrapped->Ref();
    }
    int Unref() override {
        ChangeCount(-1);
        return mWrapped->Unref();
    }

protected:
    /// wrapped is not null and not owned.
    explicit Checker(Interface* wrapped) : mLock(false), mWrapped(wrapped) {}

    /// The way to the object for every operation that only forwards.
    Interface& Checked() const {
        checkRefCount();
        return *mWrapped;
    }

    /// The tag set through the checker.
    char const* GetOwnTag() const { return mTag.Get(); }

private:
    // The check and the change are one step: of two last Unrefs at once only one passes.
    void ChangeCount(int by) {
        AutoCriticalSection const lock(mLock);
        checkRefCount();
        mRefCount += by;
    }

    CriticalSection mLock; // held to change the count; it is read without
    Interface* const mWrapped;
    Tag mTag;
    std::atomic<int> mRefCount{1};
};

} // namespace detail
} // namespace Moka
