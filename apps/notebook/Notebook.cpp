#include "apps/notebook/Notebook.h"

#include "apps/notebook/Lettering.h"
#include "moka/graphics/factory/BitmapsAndCanvases.h"

#include <algorithm>
#include <cstdio>
#include <filesystem>

namespace Moka::Notebook {
namespace {

constexpr unsigned kDesk = 0xFFDDE2E8;
constexpr float kAhead = 16;                 // milliseconds that the pen is predicted
constexpr std::uint32_t kZoomRest = 120;     // milliseconds after which a zoom is over
constexpr std::uint32_t kMessageTime = 4000; // milliseconds; errors stay until a key or a click
constexpr float kLetter = 1.8f;
constexpr float kLine = 34;

} // namespace

Notebook::Notebook(Options const& options, SDL_Window* window, RenderThread& queue)
    : mOptions(options),
      mWindow(window),
      mQueue(queue),
      mWakeEvent(SDL_RegisterEvents(1)),
      mDocument({[this](Splice const& splice) { PageHasChanged(splice); },
                 [this] {
                     mTools.Select({});
                     mImages.Forget();
                     mTiles.Clear();
                     mView.x = mView.y = 0;
                     MoveView();
                 },
                 [this](std::string const& message, bool isError) { Tell(message, isError); },
                 [this] { Wake(); }},
                static_cast<std::uint32_t>(options.autosave * 1000)),
      mImages(queue, [this] { Wake(); }),
      mPainter(mDocument.GetPage(), mImages, queue),
      mTools(mDocument.GetPage(), mPainter),
      mTiles(queue, static_cast<std::size_t>(options.cache) << 20, mPainter),
      mRecorder(options.record),
      mFrames(queue, options.statistics, [this] { Wake(); }) {
    mView.top = Toolbar::kHeight;
    FitWindow();
}

// Frames and images may still be on their way to members.
Notebook::~Notebook() { mQueue.WaitForTasks(); }

// Any thread.
void Notebook::Wake() const {
    SDL_Event event{};
    event.type = mWakeEvent;
    SDL_PushEvent(&event);
}

int Notebook::Run() {
    std::string reason;
    if (!mOptions.record.empty() && !mRecorder.IsOpen()) reason = "cannot write " + mOptions.record;
    if (reason.empty() && !mOptions.replay.empty()) mReplay.Load(mOptions.replay, reason);
    if (!reason.empty()) return std::fprintf(stderr, "moka-notebook: %s\n", reason.c_str()), 1;
    if (!mDocument.Open(mOptions.page.empty() ? Document::GetLastPath() : mOptions.page)) return 1;
    while (mIsRunning) {
        int const wait = Work();
        bool const isDue = mIsDirty && !mFrames.IsInFlight();
        TakeInput(isDue ? 0 : wait);
        if (!mIsRunning || !mIsDirty || mFrames.IsInFlight()) continue;
        // What came while the last frame was on its way, to the last moment, belongs to this one.
        if (mReplay.IsActive()) mReplay.Pump(false);
        TakeInput(0);
        if (mIsRunning) DrawFrame();
    }
    mQueue.WaitForTasks();
    if (mOptions.statistics) PrintStatistics();
    return mStatus;
}

void Notebook::PrintStatistics() const {
    mFrames.Print();
    Page const& page = mDocument.GetPage();
    std::printf("objects: %zu, page %d rows, tiles %zu KiB, history %zu KiB\n", page.GetObjects().size(),
                page.GetHeight(), mTiles.CountBytes() / 1024, page.CountHistoryBytes() / 1024);
    Document::Costs const& c = mDocument.GetCosts();
    std::printf("autosaves: %d, %llu bytes, longest %.2f ms here and %.1f ms on the document's thread\n",
                c.autosaves, static_cast<unsigned long long>(c.bytes), c.longestHere, c.longestThere);
    std::printf("longest save of the page: %.1f ms on the document's thread\n", c.longestSave);
}

void Notebook::TakeImages() {
    for (std::string const& file : mImages.Poll()) {
        for (ObjectPtr const& object : mDocument.GetPage().GetObjects()) {
            auto const* const image = std::get_if<Image>(&object->content);
            if (image && image->file == file) mTiles.Invalidate(object->bounds);
        }
        if (mImages.HasFailed(file)) Tell("cannot read the image " + file + "; replace or delete it", true);
        mIsDirty = true;
    }
}

// Does what is due. Returns the milliseconds until more is, or -1.
int Notebook::Work() {
    std::uint32_t const now = SDL_GetTicks();
    TakeImages();
    int wait = mDocument.Tick(now);
    auto const sooner = [&wait](int other) {
        wait = wait < 0 || (other >= 0 && other < wait) ? other : wait;
    };
    bool const isIdle =
        !mIsDirty && !mFrames.IsInFlight() && !mImages.IsBusy() && !mDocument.IsBusy() && !IsZooming();
    if (mReplay.IsActive()) sooner(mReplay.Pump(isIdle));
    if (IsZooming()) sooner(static_cast<int>(kZoomRest - std::min(kZoomRest, now - mZoomedAt)) + 1);
    if (!mMessage.empty() && !mIsError && now - mToldAt >= kMessageTime) {
        mMessage.clear();
        mIsDirty = true;
    } else if (!mMessage.empty() && !mIsError) {
        sooner(static_cast<int>(kMessageTime - (now - mToldAt)));
    }
    return wait;
}

// Waits so long for the first event; forever if it is negative.
void Notebook::TakeInput(int milliseconds) {
    SDL_Event event;
    bool const wasZooming = IsZooming();
    bool hasEvent = SDL_WaitEventTimeout(&event, milliseconds) != 0;
    for (; hasEvent && mIsRunning; hasEvent = SDL_PollEvent(&event) != 0) {
        mRecorder.Add(event);
        bool const isInput = event.type >= SDL_KEYDOWN && event.type < SDL_CLIPBOARDUPDATE;
        if (isInput) mFrames.Mark(SDL_GetTicks() - std::min(SDL_GetTicks(), event.common.timestamp));
        Handle(event);
    }
    if (wasZooming && !IsZooming()) mIsDirty = true; // now sharp
}

bool Notebook::IsZooming() const { return mZoomedAt != 0 && SDL_GetTicks() - mZoomedAt < kZoomRest; }

void Notebook::PageHasChanged(Splice const& splice) {
    Page const& page = mDocument.GetPage();
    bool const isOnTop =
        splice.removed.empty() && splice.at + splice.inserted.size() == page.GetObjects().size();
    if (isOnTop)
        for (ObjectPtr const& object : splice.inserted) mTiles.Add(object);
    else
        mTiles.Invalidate(splice.GetBounds());
    MoveView();
}

// The window has another size, or has to be drawn again.
void Notebook::FitWindow() {
    int width = 1;
    int height = 1;
    SDL_GetWindowSize(mWindow, &width, &height);
    mView.width = width;
    mView.height = std::max(1, height - mView.top);
    MoveView();
    mScreen = NewCanvas(mQueue, NewScreenBitmap(mQueue, width, height));
}

// At once, not with the next frame: the pen may come before it.
void Notebook::MoveView() {
    mView.Clamp(mDocument.GetPage().GetHeight());
    mIsDirty = true;
}

void Notebook::DrawFrame() {
    mIsDirty = false;
    if (!mScreen) return;
    mFrames.Begin();
    Page const& page = mDocument.GetPage();
    IMKCanvas& canvas = *mScreen;
    canvas.ClearAll(static_cast<int>(kDesk));
    bool const isDone = mTiles.Draw(canvas, mView, page.GetHeight(), IsZooming(), mFrames.GetLast());
    canvas.Save(IMKCanvasBase::SaveAll);
    mView.Apply(canvas);
    mTools.Draw(canvas, mView.zoom, kAhead);
    canvas.Restore(-1);
    mToolbar.Draw(canvas, mView.width, mTools, page, GetStatus());
    DrawMessage(canvas);
    if (!mQueue.Present()) {
        std::fprintf(stderr, "moka-notebook: the window has gone; the page is kept\n");
        mIsRunning = false;
        mStatus = mDocument.Close() ? 0 : 1;
    }
    mFrames.End();
    if (!isDone && !IsZooming()) mIsDirty = true;
}

std::string Notebook::GetStatus() const {
    std::string const name = std::filesystem::path(mDocument.GetPath()).filename().string();
    char zoom[16];
    std::snprintf(zoom, sizeof(zoom), "%.0f%%", mView.zoom * 100);
    return name + (mDocument.HasUnsaved() ? " *" : "") + "  " + zoom;
}

void Notebook::DrawMessage(IMKCanvas& canvas) const {
    bool const isAsking = mAsking != Command::None;
    std::string text = isAsking ? mQuestion + ": " + mAnswer + "_" : mMessage;
    if (text.empty()) return;
    auto const width = static_cast<float>(mView.width);
    auto const bottom = static_cast<float>(mView.top + mView.height);
    // Long ones take several lines.
    auto const perLine =
        static_cast<std::size_t>(std::max(20.0f, (width - 24) / MeasureLetters("m", kLetter)));
    std::size_t const count = (text.size() + perLine - 1) / perLine;
    auto const lines = static_cast<float>(count);
    float const top = bottom - lines * (kLine - 12) - 12;
    MKPaint const back = MakePaint(isAsking ? 0xF0FFF8DC : mIsError ? 0xF0FBE3E0 : 0xF0E3F3E6);
    canvas.DrawRect(0, top, width, bottom, &back);
    unsigned const ink = !isAsking && mIsError ? 0xFF9B2C1F : 0xFF33404F;
    for (float y = top + 9; !text.empty(); y += kLine - 12) {
        DrawLetters(canvas, text.substr(0, perLine), 12, y, kLetter, ink);
        text.erase(0, perLine);
    }
}

void Notebook::Tell(std::string const& message, bool isError) {
    if (mIsError && !mMessage.empty() && !isError) return; // which nobody has read yet
    mMessage = message;
    mIsError = isError;
    mToldAt = SDL_GetTicks();
    mIsDirty = true;
    if (isError) std::fprintf(stderr, "moka-notebook: %s\n", message.c_str());
}

} // namespace Moka::Notebook
