#include "apps/notebook/Input.h"

#include <algorithm>
#include <cmath>

namespace Moka::Notebook {
namespace {

constexpr float kWheelStep = 80;
constexpr double kWheelZoom = 1.15;

float GetDistance(SDL_FPoint const& a, SDL_FPoint const& b) { return std::hypot(a.x - b.x, a.y - b.y); }

} // namespace

void Input::Handle(SDL_Event const& event) {
    switch (event.type) {
    case SDL_MOUSEBUTTONDOWN:
    case SDL_MOUSEBUTTONUP:
        return HandleButton(event.button);
    case SDL_MOUSEMOTION:
        return HandleMotion(event.motion);
    case SDL_MOUSEWHEEL:
        return HandleWheel(event.wheel);
    case SDL_FINGERDOWN:
    case SDL_FINGERMOTION:
    case SDL_FINGERUP:
        return HandleFinger(event.tfinger);
    case SDL_KEYDOWN:
    case SDL_KEYUP: {
        SDL_Keysym const& key = event.key.keysym;
        bool const isControlKey = key.sym == SDLK_LCTRL || key.sym == SDLK_RCTRL;
        mIsControl = isControlKey ? event.type == SDL_KEYDOWN : (key.mod & KMOD_CTRL) != 0;
        if (event.type == SDL_KEYDOWN) mSink.Key(key.sym, mIsControl, (key.mod & KMOD_SHIFT) != 0);
        return;
    }
    case SDL_TEXTINPUT:
        return mSink.Text(event.text.text);
    case SDL_DROPFILE: {
        if (!event.drop.file) return;
        std::string const file = event.drop.file;
        SDL_free(event.drop.file);
        return mSink.Drop(file, mMouse.x, mMouse.y);
    }
    case SDL_WINDOWEVENT:
        return mSink.Show();
    case SDL_QUIT:
        return mSink.Quit();
    default:
        return;
    }
}

void Input::HandleButton(SDL_MouseButtonEvent const& button) {
    if (button.which == SDL_TOUCH_MOUSEID) return;
    mMouse = {static_cast<float>(button.x), static_cast<float>(button.y)};
    bool const isDown = button.type == SDL_MOUSEBUTTONDOWN;
    if (button.button == SDL_BUTTON_MIDDLE)
        mIsPanning = isDown;
    else if (button.button == SDL_BUTTON_LEFT && isDown)
        mSink.PenDown(mMouse.x, mMouse.y, button.timestamp, -1);
    else if (button.button == SDL_BUTTON_LEFT)
        mSink.PenUp();
}

void Input::HandleMotion(SDL_MouseMotionEvent const& motion) {
    if (motion.which == SDL_TOUCH_MOUSEID) return;
    SDL_FPoint const at{static_cast<float>(motion.x), static_cast<float>(motion.y)};
    if (mIsPanning)
        mSink.Pan(at.x - mMouse.x, at.y - mMouse.y);
    else if (motion.state & SDL_BUTTON_LMASK)
        mSink.PenMove(at.x, at.y, motion.timestamp, -1);
    mMouse = at;
}

void Input::HandleWheel(SDL_MouseWheelEvent const& wheel) {
    if (mIsControl)
        mSink.Zoom(mMouse.x, mMouse.y, std::pow(kWheelZoom, static_cast<double>(wheel.preciseY)));
    else
        mSink.Pan(-wheel.preciseX * kWheelStep, wheel.preciseY * kWheelStep);
}

SDL_FPoint Input::ToWindow(SDL_TouchFingerEvent const& finger) const {
    int width = 1;
    int height = 1;
    SDL_GetWindowSize(mWindow, &width, &height);
    return {finger.x * static_cast<float>(width), finger.y * static_cast<float>(height)};
}

void Input::HandleFinger(SDL_TouchFingerEvent const& finger) {
    SDL_FPoint const at = ToWindow(finger);
    // Devices without a sensor say 1 always.
    float const pressure = finger.pressure > 0 && finger.pressure < 1 ? finger.pressure : -1;
    if (finger.type == SDL_FINGERUP) {
        if (mFingers.erase(finger.fingerId) > 0 && !mIsPinching) mSink.PenUp();
        if (mFingers.empty()) mIsPinching = false;
        return;
    }
    bool const isNew = mFingers.count(finger.fingerId) == 0;
    SDL_FPoint const before = isNew ? at : mFingers[finger.fingerId];
    mFingers[finger.fingerId] = at;
    if (isNew && mFingers.size() == 1) {
        mSink.PenDown(at.x, at.y, finger.timestamp, pressure);
    } else if (isNew) {
        mIsPinching = true;
        mSink.PenCancel();
    } else if (!mIsPinching) {
        mSink.PenMove(at.x, at.y, finger.timestamp, pressure);
    } else if (mFingers.size() == 2) {
        MoveFingers(before, at, finger.fingerId);
    }
}

// The other finger rests: half of the way moves the page, and the distance between them scales it.
void Input::MoveFingers(SDL_FPoint before, SDL_FPoint after, SDL_FingerID moved) {
    SDL_FPoint const other = std::find_if(mFingers.begin(), mFingers.end(), [&](auto const& f) {
                                 return f.first != moved;
                             })->second;
    mSink.Pan((after.x - before.x) / 2, (after.y - before.y) / 2);
    float const was = std::max(GetDistance(before, other), 1.0f);
    mSink.Zoom((after.x + other.x) / 2, (after.y + other.y) / 2,
               static_cast<double>(std::max(GetDistance(after, other), 1.0f) / was));
}

} // namespace Moka::Notebook
