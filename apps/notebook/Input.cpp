// What SDL's events mean.
#include "apps/notebook/Notebook.h"

#include <algorithm>
#include <cmath>

namespace Moka::Notebook {
namespace {

constexpr float kWheelStep = 80;
constexpr double kWheelZoom = 1.15;

float GetDistance(PointF const& a, PointF const& b) {
    return std::max(std::hypot(a.x - b.x, a.y - b.y), 1.0f);
}

PointF MakePoint(int x, int y) { return {static_cast<float>(x), static_cast<float>(y)}; }

} // namespace

void Notebook::Handle(SDL_Event const& event) {
    switch (event.type) {
    case SDL_MOUSEBUTTONDOWN:
    case SDL_MOUSEBUTTONUP:
        return HandleButton(event.button);
    case SDL_MOUSEMOTION:
        return HandleMotion(event.motion);
    case SDL_MOUSEWHEEL:
        if (mIsControl) return Zoom(mMouse, std::pow(kWheelZoom, static_cast<double>(event.wheel.preciseY)));
        return Pan(-event.wheel.preciseX * kWheelStep, event.wheel.preciseY * kWheelStep);
    case SDL_FINGERDOWN:
    case SDL_FINGERMOTION:
    case SDL_FINGERUP:
        return HandleFinger(event.tfinger);
    case SDL_KEYDOWN:
    case SDL_KEYUP: {
        SDL_Keysym const& key = event.key.keysym;
        bool const isControlKey = key.sym == SDLK_LCTRL || key.sym == SDLK_RCTRL;
        mIsControl = isControlKey ? event.type == SDL_KEYDOWN : (key.mod & KMOD_CTRL) != 0;
        if (event.type == SDL_KEYDOWN) Key(key.sym, (key.mod & KMOD_SHIFT) != 0);
        return;
    }
    case SDL_TEXTINPUT:
        if (mAsking != Command::None) mAnswer += event.text.text;
        mIsDirty = true;
        return;
    case SDL_DROPFILE:
        if (event.drop.file) Drop(event.drop.file, mMouse);
        return SDL_free(event.drop.file);
    case SDL_WINDOWEVENT:
        return FitWindow();
    case SDL_QUIT:
        return Quit();
    default:
        return;
    }
}

void Notebook::HandleButton(SDL_MouseButtonEvent const& button) {
    if (button.which == SDL_TOUCH_MOUSEID) return;
    mMouse = MakePoint(button.x, button.y);
    bool const isDown = button.type == SDL_MOUSEBUTTONDOWN;
    if (button.button == SDL_BUTTON_MIDDLE)
        mIsPanning = isDown;
    else if (button.button == SDL_BUTTON_LEFT && isDown)
        PenDown(mMouse, button.timestamp, -1);
    else if (button.button == SDL_BUTTON_LEFT)
        PenUp(true);
}

void Notebook::HandleMotion(SDL_MouseMotionEvent const& motion) {
    if (motion.which == SDL_TOUCH_MOUSEID) return;
    PointF const at = MakePoint(motion.x, motion.y);
    if (mIsPanning)
        Pan(at.x - mMouse.x, at.y - mMouse.y);
    else if (motion.state & SDL_BUTTON_LMASK)
        mTools.Move(mView.ToPage(at), motion.timestamp, -1, mView.zoom);
    mMouse = at;
    mIsDirty = true;
}

void Notebook::HandleFinger(SDL_TouchFingerEvent const& finger) {
    PointF const at(finger.x * static_cast<float>(mView.width),
                    finger.y * static_cast<float>(mView.height + mView.top));
    mIsDirty = true;
    // Devices without a sensor say 1 always.
    float const pressure = finger.pressure > 0 && finger.pressure < 1 ? finger.pressure : -1;
    if (finger.type == SDL_FINGERUP) {
        if (mFingers.erase(finger.fingerId) > 0 && !mIsPinching) PenUp(true);
        if (mFingers.empty()) mIsPinching = false;
        return;
    }
    bool const isNew = mFingers.count(finger.fingerId) == 0;
    PointF const before = isNew ? at : mFingers[finger.fingerId];
    mFingers[finger.fingerId] = at;
    if (isNew && mFingers.size() == 1) {
        PenDown(at, finger.timestamp, pressure);
    } else if (isNew) {
        mIsPinching = true;
        PenUp(false);
    } else if (!mIsPinching) {
        mTools.Move(mView.ToPage(at), finger.timestamp, pressure, mView.zoom);
    } else if (mFingers.size() == 2) {
        MoveFingers(before, at, finger.fingerId);
    }
}

// The other finger rests: half of the way moves the page, and the distance between them scales it.
void Notebook::MoveFingers(PointF const& before, PointF const& after, SDL_FingerID moved) {
    bool const isFirst = mFingers.begin()->first == moved;
    PointF const other = isFirst ? mFingers.rbegin()->second : mFingers.begin()->second;
    Pan((after.x - before.x) / 2, (after.y - before.y) / 2);
    Zoom({(after.x + other.x) / 2, (after.y + other.y) / 2},
         static_cast<double>(GetDistance(after, other) / GetDistance(before, other)));
}

} // namespace Moka::Notebook
