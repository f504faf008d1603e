// Input: what SDL's events mean: a pen (mouse or one finger), two fingers that pan and zoom, a wheel, keys, dropped
// files. The second finger takes back what the first one has begun.
// Thread: the window's.
// Units:  the window's pixels; milliseconds as the events have them. Pressure is 0 ... 1, -1 where it is unknown.
#pragma once

#include <SDL.h>
#include <cstdint>
#include <map>
#include <string>

namespace Moka::Notebook {

class InputSink {
public:
    virtual void PenDown(float x, float y, std::uint32_t time, float pressure) = 0;
    virtual void PenMove(float x, float y, std::uint32_t time, float pressure) = 0;
    virtual void PenUp() = 0;
    virtual void PenCancel() = 0;
    virtual void Pan(float dx, float dy) = 0;
    virtual void Zoom(float x, float y, double factor) = 0;
    virtual void Key(SDL_Keycode key, bool isControl, bool isShift) = 0;
    virtual void Text(std::string const& text) = 0;
    virtual void Drop(std::string const& file, float x, float y) = 0;
    virtual void Show() = 0; // the window has another size, or has to be drawn again
    virtual void Quit() = 0;

protected:
    ~InputSink() = default;
};

class Input {
public:
    Input(SDL_Window* window, InputSink& sink) : mWindow(window), mSink(sink) {}

    void Handle(SDL_Event const& event);

private:
    void HandleButton(SDL_MouseButtonEvent const& button);
    void HandleMotion(SDL_MouseMotionEvent const& motion);
    void HandleWheel(SDL_MouseWheelEvent const& wheel);
    void HandleFinger(SDL_TouchFingerEvent const& finger);
    void MoveFingers(SDL_FPoint before, SDL_FPoint after, SDL_FingerID moved);
    SDL_FPoint ToWindow(SDL_TouchFingerEvent const& finger) const;

    SDL_Window* const mWindow;
    InputSink& mSink;
    std::map<SDL_FingerID, SDL_FPoint> mFingers;
    bool mIsPinching = false; // until the last finger is up
    bool mIsPanning = false;  // with the middle button
    bool mIsControl = false;
    SDL_FPoint mMouse{0, 0};
};

} // namespace Moka::Notebook
