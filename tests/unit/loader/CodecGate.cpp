#include "tests/unit/loader/CodecGate.h"

#include "moka/base/BitmapFactory.h"

#include <atomic>
#include <condition_variable>
#include <cstdlib>
#include <mutex>
#include <new>

#include <dlfcn.h>

namespace Moka {
namespace {

struct Gate {
    std::mutex mutex;
    std::condition_variable changed;
    bool closed = false;
    int waiting = 0;
};

// Never destroyed: a codec may wait at it while the process ends.
Gate& TheGate() {
    static Gate& gate = *new Gate;
    return gate;
}

std::atomic<bool> throwing{false};

void Pass() {
    if (throwing) throw std::bad_alloc();
    Gate& gate = TheGate();
    std::unique_lock<std::mutex> lock(gate.mutex);
    ++gate.waiting;
    gate.changed.notify_all();
    gate.changed.wait(lock, [&] { return !gate.closed; });
    --gate.waiting;
}

// The library's own function, which the one of the same name here hides.
template <class Function>
Function Find(char const* symbol) {
    void* const found = dlsym(RTLD_NEXT, symbol);
    if (!found) std::abort();
    return reinterpret_cast<Function>(found);
}

} // namespace

Bitmap* BitmapFactory::CreateBitmap(String const* path, int width, int height) {
    static auto const real =
        Find<Bitmap* (*)(String const*, int, int)>("_ZN4Moka13BitmapFactory12CreateBitmapEPKNS_6StringEii");
    Pass();
    return real(path, width, height);
}

Bitmap* BitmapFactory::CreateBitmapForGraphics(String const* path) {
    static auto const real =
        Find<Bitmap* (*)(String const*)>("_ZN4Moka13BitmapFactory23CreateBitmapForGraphicsEPKNS_6StringE");
    Pass();
    return real(path);
}

bool BitmapFactory::SaveBitmap(Bitmap const* bitmap, String const* path, int quality) {
    static auto const real = Find<bool (*)(Bitmap const*, String const*, int)>(
        "_ZN4Moka13BitmapFactory10SaveBitmapEPKNS_6BitmapEPKNS_6StringEi");
    Pass();
    return real(bitmap, path, quality);
}

namespace Testing {

CodecGate::CodecGate() {
    std::lock_guard<std::mutex> const lock(TheGate().mutex);
    TheGate().closed = true;
}

CodecGate::~CodecGate() { Open(); }

void CodecGate::AwaitArrival() {
    std::unique_lock<std::mutex> lock(TheGate().mutex);
    TheGate().changed.wait(lock, [] { return TheGate().waiting > 0; });
}

void CodecGate::Open() {
    std::lock_guard<std::mutex> const lock(TheGate().mutex);
    TheGate().closed = false;
    TheGate().changed.notify_all();
}

ThrowingCodecs::ThrowingCodecs() { throwing = true; }
ThrowingCodecs::~ThrowingCodecs() { throwing = false; }

} // namespace Testing
} // namespace Moka
