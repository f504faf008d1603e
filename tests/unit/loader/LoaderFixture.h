// LoaderFixture: the loader with its loop running, a render thread without GL, a folder of its own for files,
// and the log. Every test ends with the loader idle, nothing alive on the render thread and nothing misused.
#pragma once

#include "moka/base/Bitmap.h"
#include "moka/base/RefPtr.h"
#include "moka/base/String.h"
#include "moka/base/System.h"
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/bitmap/ImageDecoding.h"
#include "moka/graphics/factory/MKGraphicsFactory.h"
#include "moka/graphics/loader/BitmapLoaderImpl.h"
#include "moka/graphics/loader/MKBitmapLoader.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestFiles.h"
#include "tests/support/TracingThread.h"
#include "tests/unit/loader/CodecGate.h"

#include <algorithm>
#include <functional>
#include <gtest/gtest.h>
#include <memory>

namespace Moka::Testing {

using detail::BitmapLoaderImpl;

using Events = std::vector<std::string>;

// What a listener is told, in order: "pending", "load 1 5x4", "error 1", "save 1", "save error 1",
// "completed".
class RecordingListener : public BitmapLoaderInterface {
public:
    void OnLoad(int id, String const&, Bitmap& bitmap) override { Loaded(id, bitmap, &bitmap, nullptr); }
    void OnLoad(int id, String const&, IMKBitmap& bitmap) override { Loaded(id, bitmap, nullptr, &bitmap); }
    void OnLoadError(int id, String const&) override { Note("error " + std::to_string(id)); }
    void OnSave(int id, String const&, void*) override { Note("save " + std::to_string(id)); }
    void OnSaveError(int id, String const&, void*) override { Note("save error " + std::to_string(id)); }
    void OnCallbackPending() override { Note("pending"); }
    void OnCallbackCompleted() override { Note("completed"); }

    Events GetEvents() const { return mEvents.Get(); }
    // What became of one request after the other: the event between "pending" and "completed".
    Events GetResults() const {
        Events results = GetEvents();
        auto const isFrame = [](std::string const& e) { return e == "pending" || e == "completed"; };
        results.erase(std::remove_if(results.begin(), results.end(), isFrame), results.end());
        return results;
    }
    // Until this many requests have been completed.
    void AwaitCompleted(int count) const {
        mEvents.Await([count](Events const& events) {
            return std::count(events.begin(), events.end(), std::string("completed")) >= count;
        });
    }

    std::function<void(Bitmap*, IMKBitmap*)> whenLoaded;
    std::function<void(std::string const&)> whenNoted; // may throw

private:
    template <class Result>
    void Loaded(int id, Result& result, Bitmap* cpu, IMKBitmap* graphics) {
        if (whenLoaded) whenLoaded(cpu, graphics);
        Note("load " + std::to_string(id) + " " + std::to_string(result.GetWidth()) + "x" +
             std::to_string(result.GetHeight()));
    }
    // The listener may be gone as soon as the event is seen.
    void Note(std::string const& event) {
        auto const hook = whenNoted;
        mEvents.Update([&](auto& events) { events.push_back(event); });
        if (hook) hook(event);
    }

    Awaited<Events> mEvents;
};

class LoaderFixture : public ::testing::Test {
protected:
    static constexpr int kMaxSide = 64;

    void SetUp() override {
        MKBitmapFactory_UseNativeDecoder();
        queue = std::make_unique<TracingThread>(kMaxSide);
        StartLoop();
    }

    void TearDown() override {
        MKBitmapLoader::WaitForAllSaveRequestsToEnd(queue.get());
        Loader().WaitUntilMsgQueueRequired();
        AwaitIdle();
        System::SetBuildTypeEngMode(false);
        queue.reset();
        EXPECT_EQ(RendererTrace::CountLiveObjects(), 0);
        for (std::string const& violation : RendererTrace::GetViolations()) ADD_FAILURE() << violation;
    }

    virtual void StartLoop() { ASSERT_TRUE(MKBitmapLoader::startEventLoopBySelf()); }

    static BitmapLoaderImpl& Loader() { return BitmapLoaderImpl::GetInstance(); }

    String Path(std::string const& name) const { return String(folder.Path(name)); }
    bool Exists(std::string const& name) const { return std::filesystem::exists(folder.Path(name)); }

    // A picture file of unique opaque pixels.
    String WritePicture(std::string const& name, int width = 5, int height = 4) const {
        EXPECT_TRUE(SaveImage(MakeGradient(width, height), folder.Path(name)));
        return Path(name);
    }
    std::string ReadBytes(std::string const& name) const { return ReadFile(folder.Path(name)); }

    static unsigned char* NewPixels(Picture const& image) {
        auto* const pixels = new unsigned char[image.pixels.size()];
        std::copy(image.pixels.begin(), image.pixels.end(), pixels);
        return pixels;
    }
    RefPtr<IMKBitmap> MakeBitmap(Picture const& image) const {
        return RefPtr<IMKBitmap>::Adopt(MKGraphicsFactory::CreateBitmap(
            queue.get(), image.width, image.height, NewPixels(image), true, 1, false));
    }

    // The loop has said its last word on what was queued so far.
    void AwaitIdle() const {
        log.Await([](std::vector<LogLine> const& lines) {
            auto const last = std::find_if(lines.rbegin(), lines.rend(), [](LogLine const& line) {
                return line.text.find("::EventLoop ") != std::string::npos;
            });
            return last == lines.rend() || last->text == "BitmapLoaderImpl::EventLoop Wait!";
        });
    }

    TempFolder folder;
    LogCapture log;
    std::unique_ptr<TracingThread> queue;
    RecordingListener listener;
};

// The callbacks of a front end of either kind, which tell the listener.
template <class FrontEnd>
typename FrontEnd::Callback MakeCallback(RecordingListener& listener) {
    typename FrontEnd::Callback callback;
    callback.onLoad = [&](int id, String const& path, auto& bitmap) { listener.OnLoad(id, path, bitmap); };
    callback.onLoadError = [&](int id, String const& path) { listener.OnLoadError(id, path); };
    callback.onSave = [&](int id, String const& path, void* data) { listener.OnSave(id, path, data); };
    callback.onSaveError = [&](int id, String const& path, void* data) {
        listener.OnSaveError(id, path, data);
    };
    return callback;
}

} // namespace Moka::Testing
