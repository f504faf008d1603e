// What a person does in the window.
#include "apps/notebook/Notebook.h"
#include "apps/notebook/PageFile.h"
#include "moka/graphics/factory/BitmapsAndCanvases.h"

#include <algorithm>
#include <cmath>
#include <filesystem>

namespace Moka::Notebook {
namespace {

namespace fs = std::filesystem;

constexpr int kEnd = 8 * Page::kMaxHeight; // farther than any page reaches at any zoom
constexpr float kDropSide = 480;           // the longer side of an image that is put on the page

struct Shortcut {
    SDL_Keycode key;
    bool isControl;
    Action action;
    Action shifted; // if it is another one
};

constexpr Action ChooseTool(Tool tool) { return {Command::Choose, static_cast<int>(tool)}; }

constexpr Shortcut kShortcuts[] = {
    {SDLK_p, false, ChooseTool(Tool::Pen), {}},
    {SDLK_h, false, ChooseTool(Tool::Highlighter), {}},
    {SDLK_e, false, ChooseTool(Tool::StrokeEraser), {}},
    {SDLK_r, false, ChooseTool(Tool::PartEraser), {}},
    {SDLK_l, false, ChooseTool(Tool::Select), {}},
    {SDLK_ESCAPE, false, {Command::Escape}, {}},
    {SDLK_DELETE, false, {Command::Delete}, {}},
    {SDLK_BACKSPACE, false, {Command::Delete}, {}},
    {SDLK_LEFT, false, {Command::ScrollAcross, -60}, {}},
    {SDLK_RIGHT, false, {Command::ScrollAcross, 60}, {}},
    {SDLK_UP, false, {Command::ScrollDown, -60}, {}},
    {SDLK_DOWN, false, {Command::ScrollDown, 60}, {}},
    {SDLK_PAGEUP, false, {Command::ScrollPages, -9}, {}},
    {SDLK_PAGEDOWN, false, {Command::ScrollPages, 9}, {}},
    {SDLK_HOME, false, {Command::ScrollDown, -kEnd}, {}},
    {SDLK_END, false, {Command::ScrollDown, kEnd}, {}},
    {SDLK_PLUS, false, {Command::ZoomBy, 125}, {}},
    {SDLK_EQUALS, false, {Command::ZoomBy, 125}, {}},
    {SDLK_MINUS, false, {Command::ZoomBy, 80}, {}},
    {SDLK_0, false, {Command::ZoomOne}, {}},
    {SDLK_z, true, {Command::Undo}, {Command::Redo}},
    {SDLK_y, true, {Command::Redo}, {}},
    {SDLK_s, true, {Command::Save}, {Command::SaveAs}},
    {SDLK_o, true, {Command::Open}, {}},
    {SDLK_e, true, {Command::ExportView}, {Command::ExportPage}},
    {SDLK_v, true, {Command::Paste}, {}},
    {SDLK_q, true, {Command::Quit}, {}},
};

} // namespace

void Notebook::PenDown(PointF const& at, std::uint32_t time, float pressure) {
    if (mIsError) mMessage.clear();
    mIsDirty = true;
    if (at.y < static_cast<float>(mView.top)) return Do(mToolbar.Find(at.x));
    mTools.Down(mView.ToPage(at), time, pressure, mView.zoom);
    if (mTools.IsDragging()) mTiles.Invalidate(mTools.GetSelectedBounds());
}

void Notebook::PenUp(bool isKept) {
    bool const isDragging = mTools.IsDragging();
    isKept ? mTools.Up() : mTools.Cancel();
    if (isDragging) mTiles.Invalidate(mTools.GetSelectedBounds());
    mIsDirty = true;
}

void Notebook::Pan(float dx, float dy) {
    mView.Pan(dx, dy);
    MoveView();
}

void Notebook::Zoom(PointF const& about, double factor) {
    mView.ZoomAt(about, factor);
    mZoomedAt = SDL_GetTicks();
    MoveView();
}

void Notebook::Key(SDL_Keycode key, bool isShift) {
    if (mIsError) mMessage.clear();
    mIsDirty = true;
    auto const* const found =
        std::find_if(std::begin(kShortcuts), std::end(kShortcuts),
                     [&](Shortcut const& s) { return s.key == key && s.isControl == mIsControl; });
    Action action = found == std::end(kShortcuts) ? Action{} : found->action;
    if (isShift && found != std::end(kShortcuts) && found->shifted.command != Command::None)
        action = found->shifted;
    if (mAsking != Command::None && action.command != Command::Paste) return EditPrompt(key);
    Do(action);
}

void Notebook::EditPrompt(SDL_Keycode key) {
    if (key == SDLK_ESCAPE) mAsking = Command::None;
    if (key == SDLK_RETURN || key == SDLK_KP_ENTER) return Answer();
    if (key != SDLK_BACKSPACE) return;
    while (!mAnswer.empty() && (static_cast<unsigned char>(mAnswer.back()) & 0xC0) == 0x80)
        mAnswer.pop_back();
    if (!mAnswer.empty()) mAnswer.pop_back();
}

void Notebook::Do(Action const& action) {
    auto const value = static_cast<float>(action.value);
    auto const height = static_cast<float>(mView.height);
    PointF const middle(static_cast<float>(mView.width) / 2, static_cast<float>(mView.top) + height / 2);
    mIsDirty = true;
    switch (action.command) {
    case Command::Choose:
        return mTools.Choose(static_cast<Tool>(action.value));
    case Command::SetColor:
        return mTools.SetColor(static_cast<unsigned>(action.value));
    case Command::SetWidth:
        return mTools.SetWidth(value / 10);
    case Command::Delete:
        return mTools.DeleteSelected();
    case Command::Escape:
        mMessage.clear();
        return PenUp(false);
    case Command::Undo:
    case Command::Redo:
        mTools.Cancel();
        mTools.Select({});
        action.command == Command::Undo ? mDocument.GetPage().Undo() : mDocument.GetPage().Redo();
        return;
    case Command::ZoomBy:
        return Zoom(middle, action.value / 100.0);
    case Command::ZoomOne:
        return Zoom(middle, 1 / mView.zoom);
    case Command::ScrollAcross:
        return Pan(-value, 0);
    case Command::ScrollDown:
        return Pan(0, -value);
    case Command::ScrollPages:
        return Pan(0, -value * height / 10);
    default:
        return DoWithFiles(action.command);
    }
}

void Notebook::DoWithFiles(Command command) {
    fs::path const path = mDocument.GetPath();
    std::string const picture = fs::path(path).replace_extension("png").string();
    switch (command) {
    case Command::Save:
        if (!mDocument.MustRename()) return static_cast<void>(mDocument.Save(nullptr));
        [[fallthrough]];
    case Command::SaveAs:
        return Ask(Command::SaveAs, "save as", fs::path(path).replace_extension().string() + "-new.json");
    case Command::Open:
        return Ask(command, "open", path.parent_path() / "");
    case Command::ExportView:
        return Ask(command, "export what is seen to", picture);
    case Command::ExportPage:
        return Ask(command, "export the page to", picture);
    case Command::Paste:
        return Paste();
    case Command::Quit:
        return Quit();
    default:
        return;
    }
}

void Notebook::Ask(Command command, char const* question, std::string const& proposal) {
    mAsking = command;
    mQuestion = question;
    mAnswer = proposal;
}

void Notebook::Answer() {
    Command const command = mAsking;
    mAsking = Command::None;
    mTools.Cancel();
    if (mAnswer.empty()) return;
    if (!IsWritablePath(mAnswer)) return Tell("the name is not UTF-8; give another one", true);
    if (command == Command::SaveAs) mDocument.Save(&mAnswer);
    if (command == Command::Open) mDocument.Open(mAnswer);
    if (command == Command::ExportView || command == Command::ExportPage)
        Export(command == Command::ExportPage, mAnswer);
}

void Notebook::Export(bool isPage, std::string const& path) {
    int const width = isPage ? Page::kWidth : mView.width;
    int const height = isPage ? mDocument.GetPage().GetHeight() : mView.height;
    if (height > BitmapFactory::kMaxSide)
        return Tell("the page has " + std::to_string(height) + " rows and an image at most " +
                        std::to_string(BitmapFactory::kMaxSide) + "; export what is seen instead",
                    true);
    auto const bitmap = NewBitmap(mQueue, width, height);
    auto const canvas = NewCanvas(mQueue, bitmap);
    if (!canvas)
        return Tell("there is no memory for an image of the page; export what is seen instead", true);
    Viewport view = mView;
    view.top = 0;
    if (isPage) view = Viewport{1, 0, 0, width, height, 0};
    view.Apply(*canvas);
    canvas->ClearAll(static_cast<int>(kPaper));
    for (ObjectPtr const& object : mPainter.Find(view.GetPageArea())) mPainter.Draw(*canvas, *object);
    mDocument.Run([bitmap, path]() -> Document::Report {
        std::string reason;
        if (!SaveBitmap(*bitmap, path, 90, &reason)) return {true, "cannot export " + path + ": " + reason};
        return {false, "exported " + path};
    });
}

void Notebook::Paste() {
    char* const text = SDL_GetClipboardText();
    std::string pasted = text ? text : "";
    SDL_free(text);
    pasted.erase(std::remove(pasted.begin(), pasted.end(), '\n'), pasted.end());
    if (mAsking != Command::None)
        mAnswer += pasted;
    else if (!pasted.empty())
        Drop(pasted, {static_cast<float>(mView.width) / 2, static_cast<float>(mView.height) / 2});
}

void Notebook::Drop(std::string const& file, PointF const& at) {
    mIsDirty = true;
    fs::path path = file.rfind("file://", 0) == 0 ? file.substr(7) : file;
    path = fs::absolute(path).lexically_normal();
    if (path.extension() == ".json") return static_cast<void>(mDocument.Open(path.string()));
    Insert(path.string(), mView.ToPage({at.x, std::max(at.y, static_cast<float>(mView.top))}));
}

// Its corner at the pointer; whole on the page, and selected, so that it can be moved and scaled at once.
void Notebook::Insert(std::string file, PointF at) {
    int width = 0;
    int height = 0;
    std::string reason;
    if (!IsWritablePath(file)) return Tell("the image's name is not UTF-8; rename it first", true);
    if (!mImages.Measure(file, width, height, reason))
        return Tell("cannot put " + file + " on the page: " + reason, true);
    float const scale = std::min(1.0f, kDropSide / static_cast<float>(std::max(width, height)));
    float const w = std::round(static_cast<float>(width) * scale);
    float const h = std::round(static_cast<float>(height) * scale);
    float const left = std::round(std::clamp(at.x, 0.0f, static_cast<float>(Page::kWidth) - w));
    float const top = std::round(std::max(at.y, 0.0f));
    auto const object =
        std::make_shared<Object const>(Image{std::move(file), {left, top, left + w, top + h}});
    mTools.Choose(Tool::Select);
    mDocument.GetPage().Append(object);
    mTools.Select({object});
}

void Notebook::Quit() {
    mTools.Cancel();
    bool const isKept = mDocument.Close();
    mStatus = isKept ? 0 : 1;
    mIsRunning = !isKept && !mHasQuitFailed;
    mHasQuitFailed = true;
    if (mIsRunning) Tell(mMessage + ". Close the window again to leave all the same", true);
}

} // namespace Moka::Notebook
