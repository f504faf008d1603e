// CanvasWorld: the bitmaps, canvases and drawables that one fuzzer input makes, uses and drops, over the
// tracing renderer and a queue that runs when the input says so.
// Owner:   everything made; the destructor gives it back, in the order the input ended with, runs the queue
//          and requires that no GPU object is left and none was misused.
// Thread:  one, which stands for the render thread while tasks run and while a render-thread object is used.
// Limits:  bitmaps of at most kMaxSide a side, strips of kMaxTexture rows, so that an input takes no time.
#pragma once

#include "fuzz/FuzzInput.h"
#include "moka/base/RefPtr.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/canvas/IMKCanvas.h"
#include "moka/graphics/canvas/IMKPenCanvas.h"
#include "moka/graphics/drawable/IMKCustomDrawable.h"
#include "tests/support/PumpedRenderer.h"

#include <array>
#include <iterator>
#include <memory>
#include <vector>

namespace Moka::Fuzz {

constexpr int kMaxTexture = 64;
constexpr int kMaxSide = 200;

// Declares this thread the render thread, or not.
class ThreadScope {
public:
    explicit ThreadScope(bool onRenderThread) : mOn(onRenderThread) {
        if (mOn) Testing::RendererTrace::DeclareRenderThread();
    }
    ~ThreadScope() {
        if (mOn) Testing::RendererTrace::DeclareNoRenderThread();
    }
    ThreadScope(ThreadScope const&) = delete;
    ThreadScope& operator=(ThreadScope const&) = delete;

private:
    bool mOn;
};

// A reference, and which thread the object belongs to.
template <class T>
struct Slot {
    RefPtr<T> object;
    bool onRenderThread = false;

    // The reference held before is given back where it belongs.
    void Put(RefPtr<T> next, bool nextOnRenderThread) {
        ThreadScope const scope(onRenderThread);
        object = std::move(next);
        onRenderThread = nextOnRenderThread;
    }
    void Drop() { Put({}, false); }
};

class CanvasWorld {
public:
    explicit CanvasWorld(FuzzInput& bytes) : input(bytes) { Testing::RendererTrace::KeepRecords(false); }
    ~CanvasWorld() {
        DropAll();
        queue.RunAll();
        for (std::string const& violation : Testing::RendererTrace::GetViolations())
            Require(false, violation.c_str());
        Require(Testing::RendererTrace::CountLiveObjects() == 0, "GPU objects are left");
    }
    CanvasWorld(CanvasWorld const&) = delete;
    CanvasWorld& operator=(CanvasWorld const&) = delete;

    Slot<IMKBitmap>& PickBitmap() { return Pick(bitmaps); }
    Slot<IMKCanvas>& PickCanvas() { return Pick(canvases); }
    Slot<IMKPenCanvas>& PickPenCanvas() { return Pick(penCanvases); }
    Slot<IMKCustomDrawable>& PickDrawable() { return Pick(drawables); }

    // Into a slot, on the thread that it is for; create is told whether to use the queue.
    template <class T, class Create>
    void Make(Slot<T>& slot, bool onRenderThread, Create const& create) {
        RefPtr<T> made;
        {
            ThreadScope const scope(onRenderThread);
            made = RefPtr<T>::Adopt(create(onRenderThread ? 0 : 1));
        }
        slot.Put(std::move(made), onRenderThread);
    }

    // A bitmap that an object of this flavour may use; null when the picked one is of the other.
    IMKBitmap* PickBitmapFor(bool onRenderThread) {
        Slot<IMKBitmap> const& slot = PickBitmap();
        return slot.onRenderThread && !onRenderThread ? nullptr : slot.object.Get();
    }

    // Memory that stays until the end, since the queue may read or write it then.
    unsigned char* NewBuffer(std::size_t count) {
        return mBuffers.emplace_back(std::make_unique<unsigned char[]>(count)).get();
    }

    FuzzInput& input;
    Testing::PumpedRenderer queue{kMaxTexture};
    std::array<Slot<IMKBitmap>, 6> bitmaps;
    std::array<Slot<IMKCanvas>, 4> canvases;
    std::array<Slot<IMKPenCanvas>, 2> penCanvases;
    std::array<Slot<IMKCustomDrawable>, 3> drawables;

private:
    template <class T, std::size_t count>
    Slot<T>& Pick(std::array<Slot<T>, count>& slots) {
        return slots[static_cast<std::size_t>(input.Below(static_cast<int>(count)))];
    }
    void DropAll() {
        int const order = input.Byte();
        auto const drop = [](auto& slots) {
            for (auto& slot : slots) slot.Drop();
        };
        if ((order & 1) != 0) drop(bitmaps);
        if ((order & 2) != 0) drop(canvases);
        if ((order & 4) != 0) queue.RunAll();
        drop(drawables);
        drop(penCanvases);
        drop(canvases);
        drop(bitmaps);
    }

    std::vector<std::unique_ptr<unsigned char[]>> mBuffers;
};

// Does something with the slot's object, if there is one, on the thread that it belongs to.
template <class T, class Action>
void Use(Slot<T> const& slot, Action const& action) {
    if (!slot.object) return;
    ThreadScope const scope(slot.onRenderThread);
    action(*slot.object);
}

// One of several steps, as the input's next byte says.
template <class Steps, class... Arguments>
void DoOne(Steps const& steps, FuzzInput& input, Arguments&... arguments) {
    steps[input.Below(static_cast<int>(std::size(steps)))](arguments...);
}

} // namespace Moka::Fuzz
