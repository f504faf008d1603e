// RecordingDevice: what the recording renderer knows, under one lock: its objects, images, calls and plans.
// Every object belongs to the device until Reset(), also after its release; while no records are kept, until
// its release.
#pragma once

#include "moka/base/NonAssignable.h"
#include "moka/base/Rect.h"
#include "moka/renderer/RendererStatistics.h"
#include "tests/support/RecordingRenderer.h"

#include <list>
#include <map>
#include <memory>
#include <mutex>
#include <set>
#include <sstream>
#include <thread>
#include <unordered_map>
#include <vector>

namespace Moka::Testing::detail {

// What every device of the real renderer has at least.
constexpr int kDefaultMaxTextureSize = 4096;
constexpr char kDefaultGpuName[] = "recording renderer";

// An image; textures made from a model and targets share one.
struct Surface {
    Surface(int w, int h);

    unsigned char* At(int x, int y);
    // Enlarges the image, keeping what it shows in the corner of its first row.
    void Grow(int w, int h);

    int width;
    int height;
    std::vector<unsigned char> pixels; // RGBA8, packed
};

struct ObjectState;
using ObjectList = std::list<std::unique_ptr<ObjectState>>;

struct ObjectState {
    ObjectState(ObjectKind objectKind, int objectNumber, int objectContext)
        : kind(objectKind), number(objectNumber), context(objectContext) {}
    virtual ~ObjectState() = default;

    std::string GetName() const;
    // Whether somebody may still use its memory rightfully.
    virtual bool MustStay() const { return !released; }

    ObjectKind const kind;
    int const number;
    int const context; // the attachment it was made in; the object is inert in any other
    bool released = false;
    ObjectList::iterator place; // of its owner
};

struct TextureState;
class RecordingProgram;
class RecordingTarget;

struct Device : NonAssignable {
    static Device& Get();

    void Record(std::string const& object, char const* operation, std::string const& arguments);
    // For what belongs to no object: checks the thread too.
    template <class... Values>
    void RecordStatic(char const* object, char const* operation, Values const&... arguments);
    void Violate(std::string const& text) { violations.push_back(text); }
    bool IsRenderThread() const { return attached && renderThread == std::this_thread::get_id(); }
    // Notes a violation when this is not the render thread.
    void CheckThread(std::string const& object, char const* operation);
    // False, logged as a real renderer does, for a creation that a test asked to fail or that has no context.
    bool MayCreate(ObjectKind kind, char const* function, std::string const& arguments);
    // Whether the creation that is about to happen shall fail; counts it.
    bool TakeFailure(ObjectKind kind);
    int GetMaxTextureSize() const;
    int CountLive(ObjectKind kind, bool anyContext) const;
    RendererStatistics CountObjects() const;

    template <class State, class... Arguments>
    State* Add(Arguments&&... arguments) {
        auto object = std::make_unique<State>(++lastNumber[State::kKind], context,
                                              std::forward<Arguments>(arguments)...);
        State* const pointer = object.get();
        pointer->place = objects.insert(objects.end(), std::move(object));
        return pointer;
    }

    // Ends the life of an object, once; its memory is freed now when no records are kept.
    void EndObject(ObjectState& object);
    void FreeIfUnused(ObjectState const& object);
    void FreeReleased();
    // Back to the state that a context starts with.
    void ForgetState();

    // Guards everything below. Recursive: releasing one object can touch another.
    std::recursive_mutex mutable mutex;

    bool attached = false;
    int context = 0; // counts attachments
    std::thread::id renderThread;
    int deviceMaxTextureSize = kDefaultMaxTextureSize;
    int limitedTextureSize = 0;
    std::string gpuName = kDefaultGpuName;
    RendererStatistics counters; // the counters only; objects are counted when asked for

    bool keepsRecords = true;
    std::vector<RecordedCall> calls;
    std::vector<RecordedEvent> events;
    std::vector<std::string> violations;
    int creations = 0;
    std::set<int> failingCreations;
    std::set<ObjectKind> failingKinds;
    std::map<ObjectKind, int> lastNumber;

    ObjectList objects;
    std::unordered_map<void const*, TextureState*> texturesByAddress;

    RecordingTarget* active = nullptr;
    RecordingProgram* currentProgram = nullptr;
    std::map<int, TextureState const*> boundTextures;
    std::shared_ptr<Surface> host; // the host's frame buffer
    PipelineState state;
};

// The device for a scope, under its lock.
class DeviceAccess : NonAssignable {
public:
    DeviceAccess() : mDevice(Device::Get()), mLock(mDevice.mutex) {}
    Device* operator->() const { return &mDevice; }
    Device& operator*() const { return mDevice; }

private:
    Device& mDevice;
    std::lock_guard<std::recursive_mutex> const mLock;
};

// The arguments of a call as text.
template <class... Values>
std::string Join(Values const&... values) {
    std::ostringstream text;
    [[maybe_unused]] char const* separator = ""; // not read when there are no values
    ((text << separator << values, separator = " "), ...);
    return text.str();
}

template <class... Values>
void Device::RecordStatic(char const* object, char const* operation, Values const&... arguments) {
    if (keepsRecords) Record(object, operation, Join(arguments...));
    if (!IsRenderThread()) CheckThread(object, operation);
}

// One operation of an object: holds the lock, writes the call down and checks it.
class Operation : NonAssignable {
public:
    template <class... Values>
    Operation(ObjectState const& object, char const* name, Values const&... arguments)
        : mDevice(Device::Get()) {
        mDevice.mutex.lock();
        if (mDevice.keepsRecords) mDevice.Record(object.GetName(), name, Join(arguments...));
        Check(object, name);
    }
    // For getters: checked, not written down.
    enum Quiet { kQuiet };
    Operation(Quiet, ObjectState const& object, char const* name);
    ~Operation() { mDevice.mutex.unlock(); }

    // Whether the object can still do it: not released, and its context attached.
    explicit operator bool() const { return mUsable; }
    Device* operator->() const { return &mDevice; }

private:
    void Check(ObjectState const& object, char const* name);

    Device& mDevice;
    bool mUsable = false;
};

// The part of a block that lies inside width x height; empty (all zero) when there is none.
Rect ClipBlock(int x, int y, int blockWidth, int blockHeight, int width, int height);

} // namespace Moka::Testing::detail
