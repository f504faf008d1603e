// Notebook: the window: what comes in goes to the tools and the document, and what they say is drawn.
// Owner:   main; the SDL window outlives it.
// Thread:  the one that made the window.
// Units:   the window's pixels; milliseconds as SDL's events have them. Pressure is 0 ... 1, -1 where it is unknown.
#pragma once

#include "apps/notebook/Document.h"
#include "apps/notebook/Frames.h"
#include "apps/notebook/Replay.h"
#include "apps/notebook/TileCache.h"
#include "apps/notebook/Toolbar.h"

#include <map>
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

class Notebook {
public:
    Notebook(Options const& options, SDL_Window* window, RenderThread& queue);
    ~Notebook();

    // Until the window is closed. The exit status.
    int Run();

private:
    // What SDL's events mean: a pen (mouse or one finger), two fingers that pan and zoom, a wheel, keys, dropped
    // files. The second finger takes back what the first one has begun.
    void Handle(SDL_Event const& event);
    void HandleButton(SDL_MouseButtonEvent const& button);
    void HandleMotion(SDL_MouseMotionEvent const& motion);
    void HandleFinger(SDL_TouchFingerEvent const& finger);
    void MoveFingers(PointF const& before, PointF const& after, SDL_FingerID moved);

    void PenDown(PointF const& at, std::uint32_t time, float pressure);
    void PenUp(bool isKept);
    void Pan(float dx, float dy);
    void Zoom(PointF const& about, double factor);
    void Key(SDL_Keycode key, bool isShift);
    void EditPrompt(SDL_Keycode key);
    void Do(Action const& action);
    void DoWithFiles(Command command);
    void Ask(Command command, char const* question, std::string const& proposal);
    void Answer();
    void Export(bool isPage, std::string const& path);
    void Paste();
    void Drop(std::string const& file, PointF const& at);
    void Insert(std::string file, PointF at);
    void Quit();
    void Tell(std::string const& message, bool isError);
    void PageHasChanged(Splice const& splice);

    void Wake() const;
    int Work();
    void TakeInput(int milliseconds);
    void TakeImages();
    bool IsZooming() const;
    void FitWindow();
    void MoveView();
    void DrawFrame();
    void DrawMessage(IMKCanvas& canvas) const;
    std::string GetStatus() const;
    void PrintStatistics() const;

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
    Recorder mRecorder;
    Replay mReplay;
    Frames mFrames;
    RefPtr<IMKCanvas> mScreen;

    std::map<SDL_FingerID, PointF> mFingers;
    PointF mMouse;
    bool mIsPinching = false; // until the last finger is up
    bool mIsPanning = false;  // with the middle button
    bool mIsControl = false;  // the key is down

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
