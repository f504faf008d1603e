#include "tests/trust/LeakLedger.h"

#include "moka/base/Bitmap.h"
#include "moka/graphics/bitmap/MKDepthStencilBuffer.h"
#include "moka/graphics/bitmap/MKFrameBuffer.h"
#include "moka/graphics/bitmap/MKScreenBitmap.h"
#include "moka/graphics/bitmap/MKSubBitmap.h"
#include "moka/graphics/canvas/MKCanvasImpl.h"
#include "moka/graphics/canvas/MKPenCanvasImpl.h"
#include "moka/graphics/drawable/CustomDrawable.h"
#include "moka/graphics/drawable/ShaderManager.h"
#include "moka/graphics/drawable/Shaders.h"
#include "moka/graphics/task/WorkerTask.h"
#include "moka/renderer/IBlendStateObject.h"
#include "moka/renderer/IDepthStencilState.h"
#include "moka/renderer/IGraphicsObject.h"
#include "moka/renderer/IRenderTarget.h"
#include "moka/renderer/ITextureObject.h"

#include <cstdlib>
#include <cstring>
#include <cxxabi.h>
#include <memory>
#include <tuple>
#include <typeinfo>

namespace Moka::Testing {
namespace {

using Undo = std::function<void()>;

// A task keeps what it is for to itself, so this looks at its bytes: behind what every task has come the
// object and, of a call, the function and its arguments.
template <class Value>
Value ReadFrom(ITask* task, std::size_t offset) {
    Value value;
    // NOLINTNEXTLINE(bugprone-sizeof-expression): a pointer's own size is meant
    std::memcpy(&value, reinterpret_cast<unsigned char const*>(task) + offset, sizeof value);
    return value;
}

template <class T>
T* ObjectOf(ITask* task) {
    return ReadFrom<T*>(task, sizeof(ITask));
}

// The first argument of a call with these.
template <class T, class First, class... Others>
First FirstArgument(ITask* task) {
    using Arguments = std::tuple<First, Others...>;
    constexpr std::size_t kBefore = sizeof(ITask) + sizeof(void*) + sizeof(void(T::*)());
    static_assert(sizeof(WorkerTask::Member<T, void (T::*)(), First, Others...>) ==
                  kBefore + sizeof(Arguments));
    Arguments const sample{};
    auto const inTuple = reinterpret_cast<unsigned char const*>(&std::get<0>(sample)) -
                         reinterpret_cast<unsigned char const*>(&sample);
    return ReadFrom<First>(task, kBefore + static_cast<std::size_t>(inTuple));
}

template <class T, class F, class... Arguments>
bool Is(ITask* task) {
    return typeid(*task) == typeid(WorkerTask::Member<T, F, Arguments...>);
}
template <class T>
bool IsDelete(ITask* task) {
    return typeid(*task) == typeid(WorkerTask::Delete<T>);
}

std::string NameOf(std::type_info const& type) {
    std::unique_ptr<char, decltype(&std::free)> const name(
        abi::__cxa_demangle(type.name(), nullptr, nullptr, nullptr), &std::free);
    return name ? name.get() : type.name();
}

// Whether it calls a member function of T, whatever function.
template <class T>
bool IsFor(ITask* task) {
    static std::string const prefix = "Moka::WorkerTask::Member<" + NameOf(typeid(T)) + ", ";
    return NameOf(typeid(*task)).compare(0, prefix.size(), prefix) == 0;
}

template <class T>
Undo DeleteOf(ITask* task) {
    return [object = ObjectOf<T>(task)] { delete object; };
}
template <class T>
Undo UnrefOf(ITask* task) {
    return [object = ObjectOf<T>(task)] { object->Unref(); };
}
template <class T>
Undo ReleaseOf(ITask* task) {
    return [object = ObjectOf<T>(task)] { object->Release(); };
}

Undo UndoDelete(ITask* task) {
    if (IsDelete<ITextureObject>(task)) return DeleteOf<ITextureObject>(task);
    if (IsDelete<MKFrameBuffer>(task)) return DeleteOf<MKFrameBuffer>(task);
    if (IsDelete<MKDepthStencilBuffer>(task)) return DeleteOf<MKDepthStencilBuffer>(task);
    if (IsDelete<Bitmap>(task)) return DeleteOf<Bitmap>(task);
    if (IsDelete<MKCanvasImpl>(task)) return DeleteOf<MKCanvasImpl>(task);
    if (IsDelete<MKPenCanvasImpl>(task)) return DeleteOf<MKPenCanvasImpl>(task);
    if (typeid(*task) == typeid(WorkerTask::DeleteArray<unsigned char const>))
        return [array = ObjectOf<unsigned char const>(task)] { delete[] array; };
    return {};
}

template <class T>
bool IsRelease(ITask* task) {
    return Is<T, void (T::*)()>(task);
}

template <class Shader>
Undo UndoOfShader(ITask* task) {
    using Drawable = detail::CustomDrawable<Shader>;
    if (Is<Drawable, void (Drawable::*)()>(task)) return UnrefOf<Drawable>(task);
    if (!Is<ShaderManager, void (ShaderManager::*)(Shader*), Shader*>(task)) return {};
    return [shader = FirstArgument<ShaderManager, Shader*>(task)] {
        ShaderManager::GetInstance()->ReleaseShader(shader);
    };
}

Undo UndoDrawableWork(ITask* task) {
    if (IsRelease<IGraphicsObject>(task)) return ReleaseOf<IGraphicsObject>(task);
    if (IsRelease<IBlendStateObject>(task)) return ReleaseOf<IBlendStateObject>(task);
    if (IsRelease<IDepthStencilState>(task)) return ReleaseOf<IDepthStencilState>(task);
    if (Undo undo = UndoOfShader<MKGaussianBlurShader>(task)) return undo;
    if (Undo undo = UndoOfShader<MKTextMaskBitmapShader>(task)) return undo;
    return UndoOfShader<MKBlenderBitmapsShader>(task);
}

// A request for a bitmap or a drawable holds a reference on it; other requests of canvases hold nothing.
Undo UndoCanvasWork(ITask* task) {
    using M = Matrix3<float>;
    using P = MKPaint;
    using Rects = std::vector<RectF>*;
    using DrawBitmap = void (MKCanvasImpl::*)(IMKBitmap*, RectF const&, RectF const&, M const&, P const&);
    using DrawBitmaps = void (MKCanvasImpl::*)(IMKBitmap*, RectF const&, Rects, M const&, P const&);
    using Draw = void (MKCanvasImpl::*)(IMKCustomDrawable*, M const&, P const&);
    if (Is<MKCanvasImpl, DrawBitmap, IMKBitmap*, RectF, RectF, M, P>(task))
        return [b = FirstArgument<MKCanvasImpl, IMKBitmap*, RectF, RectF, M, P>(task)] { b->Unref(); };
    if (Is<MKCanvasImpl, DrawBitmaps, IMKBitmap*, RectF, Rects, M, P>(task))
        return [b = FirstArgument<MKCanvasImpl, IMKBitmap*, RectF, Rects, M, P>(task)] { b->Unref(); };
    if (Is<MKCanvasImpl, Draw, IMKCustomDrawable*, M, P>(task))
        return [d = FirstArgument<MKCanvasImpl, IMKCustomDrawable*, M, P>(task)] { d->Unref(); };
    if (IsFor<MKCanvasImpl>(task) || IsFor<MKPenCanvasImpl>(task) || IsFor<MKCanvasImplBase>(task))
        return [] {};
    return {};
}

// Every task of a bitmap or strip holds a reference on it.
Undo UndoBitmapWork(ITask* task) {
    if (Is<MKSubBitmap, void (MKSubBitmap::*)(IMKSubBitmap*), IMKSubBitmap*>(task))
        return
            [strip = ObjectOf<MKSubBitmap>(task), model = FirstArgument<MKSubBitmap, IMKSubBitmap*>(task)] {
                if (model) model->Unref();
                strip->Unref();
            };
    if (IsFor<MKSubBitmap>(task)) return UnrefOf<MKSubBitmap>(task);
    if (IsFor<MKScreenBitmap>(task)) return UnrefOf<MKScreenBitmap>(task);
    if (IsRelease<IRenderTarget>(task)) return ReleaseOf<IRenderTarget>(task);
    if (IsFor<RefCount>(task)) return UnrefOf<RefCount>(task);
    return {};
}

} // namespace

bool LeakLedger::Enter(ITask* task) {
    for (auto* const undoOf : {UndoDelete, UndoBitmapWork, UndoCanvasWork, UndoDrawableWork})
        if (Undo undo = undoOf(task)) {
            mEntries.push_back(std::move(undo));
            ++mKinds[NameOf(typeid(*task))];
            return true;
        }
    return false;
}

void LeakLedger::Settle() {
    for (Undo const& undo : mEntries) undo();
    mEntries.clear();
}

bool UnreliableQueue::Accepts(int, ITask* task) {
    ++mOffered;
    if (mReliable || static_cast<int>(mRandom() % 100) >= mPercent) return true;
    if (!mLedger.Enter(task)) mUnknown.insert(NameOf(typeid(*task)));
    return false;
}

} // namespace Moka::Testing
