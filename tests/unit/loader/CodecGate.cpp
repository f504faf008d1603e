#include "tests/unit/loader/CodecGate.h"

#include "moka/base/BitmapFactory.h"
#include "tests/support/Awaited.h"

#include <cstdlib>
#include <new>
#include <shared_mutex>
#include <utility>

#include <dlfcn.h>

namespace Moka {
namespace {

// Held by whoever closes it. Never destroyed: a codec may wait at it while the process ends.
std::shared_mutex& TheGate() {
    static std::shared_mutex& gate = *new std::shared_mutex;
    return gate;
}

// Never destroyed either.
Testing::Awaited<int>& passing = *new Testing::Awaited<int>;

void Pass() {
    if (Testing::codecsThrow) throw std::bad_alloc();
    ++passing;
    { std::shared_lock<std::shared_mutex> const pass(TheGate()); }
    passing.Update([](int& count) { --count; });
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

CodecGate::CodecGate() { TheGate().lock(); }
CodecGate::~CodecGate() { Open(); }

void CodecGate::AwaitArrival() { passing.AwaitAtLeast(1); }

void CodecGate::Open() {
    if (std::exchange(mIsClosed, false)) TheGate().unlock();
}

std::atomic<bool> codecsThrow{false};

} // namespace Testing
} // namespace Moka
