// Notebook: the window: what comes in goes to the tools and the document, and what they say is drawn.
// Owner:   main; the SDL window outlives it.
// Thread:  the one that made the window.
#pragma once

#include "apps/notebook/Document.h"
#include "apps/notebook/Frames.h"
#include "apps/notebook/Input.h"
#include "apps/notebook/Replay.h"
#include "apps/notebook/TileCache.h"
#include "apps/notebook/Toolbar.h"
#include "apps/notebook/Viewport.h"
#include "moka/host/RenderThread.h"

#include <memory>
#include <string>

namespace Moka::Notebook {

struct Options {
    std::string page; // empty: the one that was open last
    std::string replay;
    std::string record;
    std::string trace;
    double autosave = 10; // seconds
    int cache = 96;       // MiB
    int width = 1240;     // pixels
    int height = 900;
    bool statistics = false;
};

class Notebook final : InputSink {
public:
    Notebook(Options const& options, SDL_Window* window, RenderThread& queue);
    ~Notebook();

    // Until the window is closed. The exit status.
    int Run();

private:
    void PenDown(float x, float y, std::uint32_t time, float pressure) override;
    void PenMove(float x, float y, std::uint32_t time, float pressure) override;
    void PenUp() override;
    void PenCancel() override;
    void Pan(float dx, float dy) override;
    void Zoom(float x, float y, double factor) override;
    void Key(SDL_Keycode key, bool isControl, bool isShift) override;
    void Text(std::string const& text) override;
    void Drop(std::string const& file, float x, float y) override;
    void Show() override;
    void Quit() override;

    void KeyWithControl(SDL_Keycode key, bool isShift);
    void EditPrompt(SDL_Keycode key);
    void Do(Command command);
    void Ask(Command command, char const* question, std::string const& proposal);
    void Answer();
    void Export(bool isPage, std::string const& path);
    void Insert(std::string file, PointF at);
    void Tell(std::string const& message, bool isError);
    void PageHasChanged(Splice const& splice);

    void Wake() const;
    void WaitForInput(int milliseconds);
    void Work();
    bool IsZooming() const;
    void MoveView();
    void DrawFrame();
    void DrawMessage(IMKCanvas& canvas) const;
    std::string GetStatus() const;

    Options const mOptions;
    SDL_Window* const mWindow;
    RenderThread& mQueue;
    Uint32 const mWakeEvent;
    Document mDocument;
    Images mImages;
    Painter mPainter;
    Tools mTools;
    TileCache mTiles;
    Toolbar mToolbar;
    Viewport mView;
    Input mInput;
    Recorder mRecorder;
    Replay mReplay;
    Frames mFrames;
    RefPtr<IMKCanvas> mScreen;

    std::string mMessage;
    bool mIsError = false;
    std::uint32_t mToldAt = 0;
    Command mAsking = Command::None; // what the prompt is for
    std::string mQuestion;
    std::string mAnswer;

    std::uint32_t mZoomedAt = 0;
    bool mIsDirty = true;
    bool mIsRunning = true;
    bool mHasQuitFailed = false;
    int mStatus = 0;
};

} // namespace Moka::Notebook
