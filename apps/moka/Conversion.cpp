#include "apps/moka/Conversion.h"

#include "apps/moka/Failure.h"
#include "apps/moka/Interruption.h"
#include "apps/moka/LogCollector.h"
#include "apps/moka/Progress.h"
#include "moka/base/Bitmap.h"
#include "moka/base/RefPtr.h"
#include "moka/base/String.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "moka/graphics/factory/BitmapsAndCanvases.h"
#include "moka/host/RenderThread.h"

#include <memory>
#include <new>

namespace Moka::Tool {
namespace {

using BitmapPtr = RefPtr<IMKBitmap>;

// Call this after the queue has caught up: a strip without a texture will never get one.
void CheckUpload(IMKBitmap& bitmap, std::string const& name, LogCollector const& log) {
    log.ThrowError();
    CheckStrips(bitmap, name);
}

// Decodes the file into a bitmap. The pixels are freed after the upload.
BitmapPtr Decode(ConversionRequest const& request, RenderThread& queue) {
    String const path = String::FromFileName(request.input.GetPath());
    ConversionOptions const& options = request.options;
    std::string reason;
    std::unique_ptr<Bitmap> decoded(
        options.width != 0 ? BitmapFactory::CreateBitmap(&path, options.width, options.height, &reason)
                           : BitmapFactory::CreateBitmapForGraphics(&path, &reason));
    if (!decoded) throw Failure(TellCannot("read", request.input.GetPath(), reason));
    BitmapPtr bitmap = NewBitmap(queue, std::move(decoded));
    if (!bitmap) throw Failure(request.input.GetName() + ": not enough memory to load it");
    return bitmap;
}

BitmapPtr Upload(ConversionRequest const& request, RenderThread& queue, ConversionEnvironment const& env) {
    env.progress.SetStage("decode");
    BitmapPtr bitmap = Decode(request, queue);
    env.progress.SetStage("upload");
    queue.WaitForTasks();
    CheckUpload(*bitmap, request.input.GetName(), env.log);

    BitmapPtr clone = BitmapPtr::Adopt(bitmap->Clone());
    if (!clone) env.log.Throw(request.input.GetName() + ": not enough memory to share it");
    queue.WaitForTasks();
    CheckUpload(*clone, request.input.GetName(), env.log);
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
    String const path = String::FromFileName(request.output.GetPath());
    env.progress.SetStage("encode");
    Interruption::Saving const saving(env.interruption);
    std::string reason;
    if (!BitmapFactory::SaveBitmap(&image, &path, request.options.quality, &reason))
        throw Failure(TellCannot("save", request.output.GetPath(), reason));
    request.output.Take();
}

ConversionResult ConvertFile(ConversionRequest const& request, ConversionEnvironment const& env) {
    ConversionResult result;
    result.input = ReadInfo(request.input.GetPath());
    Bitmap image;
    {
        std::unique_ptr<RenderThread> const queue = StartQueue(request.options, env);
        CheckWidth(request.input.GetName(), result.input, request.options, *queue);
        BitmapPtr const bitmap = Upload(request, *queue, env);
        env.progress.SetStage("read back");
        ReadBack(*bitmap, request.input.GetName(), image, env.log);
        result.strips = bitmap->GetTextureBitmap()->GetSubBitmapCount();
        result.renderer = queue->GetContextInfo().renderer;
    }
    Save(image, request, env);
    result.output = ReadInfo(request.output.GetPath());
    return result;
}

} // namespace

ConversionResult Convert(ConversionRequest const& request, ConversionEnvironment const& env) {
    try {
        return ConvertFile(request, env);
    } catch (Failure const& failure) {
        throw Failure(static_cast<ExitStatus>(failure.GetStatus()), request.input.Explain(failure.what()));
    }
}

} // namespace Moka::Tool
