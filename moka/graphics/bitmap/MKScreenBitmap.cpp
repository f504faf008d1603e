#include "moka/graphics/bitmap/MKScreenBitmap.h"

#include "moka/base/Trace.h"
#include "moka/graphics/bitmap/BlockingRead.h"
#include "moka/graphics/task/WorkerTask.h"
#include "moka/renderer/IRenderTarget.h"

namespace Moka {

template <class F, class... Values>
bool MKScreenBitmap::PostSelf(F function, Values&&... values) {
    Ref();
    return WorkerTask::PostMember(mMsgQueue, this, function, std::forward<Values>(values)...);
}

MKScreenBitmap::MKScreenBitmap(IGLMsgQueue* queue, int x, int y, int width, int height, FramebufferType type)
    : MKScreenBitmapBase(queue, x, y, width, height, type) {
    PostSelf(&MKScreenBitmap::createRenderTargetRT, width, height, type, true);
}

MKScreenBitmap::~MKScreenBitmap() {
    if (IRenderTarget* const target = GetRenderTarget())
        WorkerTask::PostMember(mMsgQueue, target, &IRenderTarget::Release);
}

void MKScreenBitmap::createRenderTargetRT(int width, int height, FramebufferType type, bool release) {
    Trace::NameTask("createRenderTargetRT");
    CreateRenderTarget(width, height, type, "createRenderTargetRT");
    if (release) Unref();
}

void MKScreenBitmap::ActivateFrameBuffer() { PostSelf(&MKScreenBitmap::ActivateFrameBufferRT, true); }

unsigned int MKScreenBitmap::GetPixel(Point const& p) {
    unsigned int pixel = 0;
    PostSelf(&MKScreenBitmap::getPixelRT, pixel, p); // writes into the task's copy of pixel
    mMsgQueue->WaitForTasks();
    return pixel;
}

void MKScreenBitmap::getPixelRT(unsigned int& result, Point const& p) {
    Trace::NameTask("getPixelRT");
    result = ReadPixel(p);
    Unref();
}

void MKScreenBitmap::GetPixelAsync(Point const& p, void* userData, PixelCallback callback) {
    PostSelf(&MKScreenBitmap::getPixelAsyncRT, p, userData, callback);
}

void MKScreenBitmap::getPixelAsyncRT(Point const& p, void* userData, PixelCallback callback) {
    Trace::NameTask("getPixelAsyncRT");
    auto const self = RefPtr<MKScreenBitmap>::Adopt(this);
    unsigned int const pixel = ReadPixel(p);
    if (callback) callback(pixel, userData);
}

void MKScreenBitmap::GetBitmapData(Rect const& r, void* destination) {
    auto const read = detail::BlockingRead::Make();
    bool const accepted = PostSelf(&MKScreenBitmap::getBitmapDataRT, r, destination, read);
    mMsgQueue->WaitForTasks();
    detail::BlockingRead::CheckFinished(read, accepted);
}

void MKScreenBitmap::getBitmapDataRT(Rect const& r, void* destination,
                                     detail::BlockingRead::Ptr const& read) {
    Trace::NameTask("getBitmapDataRT");
    ReadBlock(r, destination);
    if (read) read->Finish(0);
    Unref();
}

void MKScreenBitmap::GetBitmapDataAsync(Rect const& r, void* destination, void* userData,
                                        DataCallback callback) {
    PostSelf(&MKScreenBitmap::getBitmapDataAsyncRT, r, destination, userData, callback);
}

void MKScreenBitmap::getBitmapDataAsyncRT(Rect const& r, void* destination, void* userData,
                                          DataCallback callback) {
    Trace::NameTask("getBitmapDataAsyncRT");
    auto const self = RefPtr<MKScreenBitmap>::Adopt(this);
    ReadBlock(r, destination);
    if (callback) callback(r, destination, userData);
}

} // namespace Moka
