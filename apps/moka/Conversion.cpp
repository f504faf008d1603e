#include "apps/moka/Conversion.h"

#include "apps/moka/Failure.h"
#include "apps/moka/Interruption.h"
#include "apps/moka/LogCollector.h"
#include "apps/moka/Progress.h"
#include "moka/base/Bitmap.h"
#include "moka/base/RefPtr.h"
#include "moka/base/String.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/bitmap/IMKSubBitmap.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "moka/graphics/bitmap/ImageDecoding.h"
#include "moka/graphics/bitmap/MKGraphicsFactory.h"
#include "moka/host/RenderThread.h"

#include <algorithm>
#include <cstdint>
#include <memory>
#include <new>

namespace Moka::Tool {
namespace {

using BitmapPtr = RefPtr<IMKBitmap>;
using Queue = std::unique_ptr<RenderThread>;

ImageInfo ReadInfo(std::string const& path, LogCollector const& log) {
    String const text(path);
    ImageInfo info;
    if (!BitmapFactory::GetImageInfo(&text, &info)) log.Throw("cannot read " + path);
    return info;
}

Queue StartQueue(int maxTextureSize, LogCollector& log) {
    RenderThreadOptions options;
    options.limits.maxTextureSize = maxTextureSize;
    std::string error;
    Queue queue = RenderThread::Start(options, &error);
    if (!queue) throw Failure(error);
    // What was tried in vain before a driver answered is no failure.
    log.Clear();
    return queue;
}

// Height is cut into strips, width is not.
void CheckWidth(ConversionRequest const& request, ImageInfo const& info, int largest) {
    int const width = request.width ? request.width : info.width;
    if (width <= largest) return;
    std::string const limit = "this device takes textures up to " + std::to_string(largest);
    if (request.width) throw Failure("--size asks for " + std::to_string(width) + " pixels across; " + limit);
    std::int64_t const height = std::max<std::int64_t>(1, std::int64_t{info.height} * largest / info.width);
    throw Failure(request.input + " is " + std::to_string(width) + " pixels wide; " + limit +
                  "; scale it, for instance with --size " + std::to_string(largest) + "x" +
                  std::to_string(height));
}

// The queue has caught up, so what has no texture now never gets one.
void CheckStrips(IMKBitmap& bitmap, std::string const& name, LogCollector const& log) {
    log.ThrowError();
    IMKTextureBitmap& strips = *bitmap.GetTextureBitmap();
    for (int i = 0; i < strips.GetSubBitmapCount(); ++i) {
        IMKSubBitmap* const strip = strips.GetSubBitmap(i);
        if (!strip || !strip->GetTexture()) throw Failure(name + ": the GPU has no room for it");
    }
}

BitmapPtr Upload(ConversionRequest const& request, RenderThread& queue, ConversionEnvironment const& env) {
    String const path(request.input);
    env.progress.SetStage("decode");
    BitmapPtr bitmap =
        BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&queue, &path, request.width, request.height, 1));
    if (!bitmap) env.log.Throw("cannot load " + request.input);
    env.progress.SetStage("upload");
    queue.WaitForTasks();
    CheckStrips(*bitmap, request.input, env.log);

    BitmapPtr clone = BitmapPtr::Adopt(bitmap->Clone());
    if (!clone) env.log.Throw(request.input + ": not enough memory to share it");
    queue.WaitForTasks();
    CheckStrips(*clone, request.input, env.log);
    return clone;
}

void ReadBack(IMKBitmap& source, std::string const& name, Bitmap& image, LogCollector const& log) {
    int const width = source.GetWidth();
    int const height = source.GetHeight();
    std::size_t const bytes = static_cast<std::size_t>(width) * static_cast<std::size_t>(height) * 4;
    auto* const pixels = new (std::nothrow) unsigned char[bytes];
    if (!pixels) throw Failure(name + ": not enough memory to read back " + std::to_string(bytes) + " bytes");
    image.Construct(pixels, width, height, width * 4, Bitmap::kFormatRgba8888, false, true);
    source.GetBitmapData(source.GetBitmapRect(), pixels);
    log.ThrowError();
}

void Save(Bitmap const& image, ConversionRequest const& request, ConversionEnvironment const& env) {
    String const path(request.output);
    env.progress.SetStage("encode");
    Interruption::Saving const saving(env.interruption);
    if (!BitmapFactory::SaveBitmap(&image, &path, request.quality))
        env.log.Throw("cannot save " + request.output);
}

} // namespace

ConversionResult Convert(ConversionRequest const& request, ConversionEnvironment const& env) {
    MKBitmapFactory_UseNativeDecoder();
    ConversionResult result;
    result.input = ReadInfo(request.input, env.log);
    Bitmap image;
    {
        Queue const queue = StartQueue(request.maxTextureSize, env.log);
        CheckWidth(request, result.input, queue->GetContextInfo().maxTextureSize);
        BitmapPtr const bitmap = Upload(request, *queue, env);
        env.progress.SetStage("read back");
        ReadBack(*bitmap, request.input, image, env.log);
        result.strips = bitmap->GetTextureBitmap()->GetSubBitmapCount();
        result.renderer = queue->GetContextInfo().renderer;
    }
    Save(image, request, env);
    result.output = ReadInfo(request.output, env.log);
    return result;
}

} // namespace Moka::Tool
