// What a person does in the window.
#include "apps/notebook/Notebook.h"

#include "apps/notebook/PageFile.h"
#include "moka/graphics/factory/BitmapsAndCanvases.h"

#include <algorithm>
#include <filesystem>

namespace Moka::Notebook {
namespace {

constexpr float kArrowStep = 60;
constexpr double kZoomStep = 1.25;
constexpr float kDropSide = 480; // the longer side of an image that is put on the page

std::string ReplaceExtension(std::string const& path, char const* extension) {
    return std::filesystem::path(path).replace_extension(extension).string();
}

} // namespace

void Notebook::PenDown(float x, float y, std::uint32_t time, float pressure) {
    if (mIsError) mMessage.clear();
    mIsDirty = true;
    if (y < static_cast<float>(mView.top)) return Do(mToolbar.Press(x, mTools));
    mTools.Down(mView.ToPage(x, y), time, pressure, mView.zoom);
    if (mTools.IsDragging()) mTiles.Invalidate(mTools.GetSelectedBounds());
}

void Notebook::PenMove(float x, float y, std::uint32_t time, float pressure) {
    mTools.Move(mView.ToPage(x, y), time, pressure, mView.zoom);
    mIsDirty = true;
}

void Notebook::PenUp() {
    bool const isDragging = mTools.IsDragging();
    mTools.Up();
    if (isDragging) mTiles.Invalidate(mTools.GetSelectedBounds());
    mIsDirty = true;
}

void Notebook::PenCancel() {
    bool const isDragging = mTools.IsDragging();
    mTools.Cancel();
    if (isDragging) mTiles.Invalidate(mTools.GetSelectedBounds());
    mIsDirty = true;
}

void Notebook::Pan(float dx, float dy) {
    mView.Pan(dx, dy);
    MoveView();
}

void Notebook::Zoom(float x, float y, double factor) {
    mView.ZoomAt(x, y, factor);
    mZoomedAt = SDL_GetTicks();
    MoveView();
}

void Notebook::Key(SDL_Keycode key, bool isControl, bool isShift) {
    if (mIsError) mMessage.clear();
    mIsDirty = true;
    if (isControl && key == SDLK_v) {
        char* const text = SDL_GetClipboardText();
        std::string pasted = text ? text : "";
        SDL_free(text);
        pasted.erase(std::remove(pasted.begin(), pasted.end(), '\n'), pasted.end());
        if (mAsking != Command::None)
            mAnswer += pasted;
        else if (!pasted.empty())
            Drop(pasted, static_cast<float>(mView.width) / 2, static_cast<float>(mView.height) / 2);
        return;
    }
    if (mAsking != Command::None) return EditPrompt(key);
    if (isControl) return KeyWithControl(key, isShift);
    auto const page = static_cast<float>(mView.height) * 0.9f;
    switch (key) {
    case SDLK_p:
        return mTools.Choose(Tool::Pen);
    case SDLK_h:
        return mTools.Choose(Tool::Highlighter);
    case SDLK_e:
        return mTools.Choose(Tool::StrokeEraser);
    case SDLK_r:
        return mTools.Choose(Tool::PartEraser);
    case SDLK_l:
        return mTools.Choose(Tool::Select);
    case SDLK_ESCAPE:
        mMessage.clear();
        return PenCancel();
    case SDLK_DELETE:
    case SDLK_BACKSPACE:
        return mTools.DeleteSelected();
    case SDLK_LEFT:
        return Pan(kArrowStep, 0);
    case SDLK_RIGHT:
        return Pan(-kArrowStep, 0);
    case SDLK_UP:
        return Pan(0, kArrowStep);
    case SDLK_DOWN:
        return Pan(0, -kArrowStep);
    case SDLK_PAGEUP:
        return Pan(0, page);
    case SDLK_PAGEDOWN:
        return Pan(0, -page);
    case SDLK_HOME:
        mView.y = 0;
        return MoveView();
    case SDLK_END:
        mView.y = mView.Scale(mDocument.GetPage().GetHeight());
        return MoveView();
    case SDLK_PLUS:
    case SDLK_EQUALS:
        return Do(Command::ZoomIn);
    case SDLK_MINUS:
        return Do(Command::ZoomOut);
    case SDLK_0:
        return Do(Command::ZoomOne);
    default:
        return;
    }
}

void Notebook::KeyWithControl(SDL_Keycode key, bool isShift) {
    switch (key) {
    case SDLK_z:
        return Do(isShift ? Command::Redo : Command::Undo);
    case SDLK_y:
        return Do(Command::Redo);
    case SDLK_s:
        return Do(isShift ? Command::SaveAs : Command::Save);
    case SDLK_o:
        return Do(Command::Open);
    case SDLK_e:
        return Do(isShift ? Command::ExportPage : Command::ExportView);
    case SDLK_q:
        return Quit();
    default:
        return;
    }
}

void Notebook::EditPrompt(SDL_Keycode key) {
    if (key == SDLK_ESCAPE) mAsking = Command::None;
    if (key == SDLK_RETURN || key == SDLK_KP_ENTER) return Answer();
    if (key != SDLK_BACKSPACE) return;
    while (!mAnswer.empty() && (static_cast<unsigned char>(mAnswer.back()) & 0xC0) == 0x80)
        mAnswer.pop_back();
    if (!mAnswer.empty()) mAnswer.pop_back();
}

void Notebook::Text(std::string const& text) {
    if (mAsking != Command::None) mAnswer += text;
    mIsDirty = true;
}

void Notebook::Do(Command command) {
    float const x = static_cast<float>(mView.width) / 2;
    float const y = static_cast<float>(mView.top) + static_cast<float>(mView.height) / 2;
    std::string const& path = mDocument.GetPath();
    mIsDirty = true;
    switch (command) {
    case Command::None:
        return;
    case Command::Undo:
    case Command::Redo:
        mTools.Cancel();
        mTools.Select({});
        command == Command::Undo ? mDocument.GetPage().Undo() : mDocument.GetPage().Redo();
        return;
    case Command::Save:
        if (!mDocument.MustRename()) return static_cast<void>(mDocument.Save(nullptr));
        [[fallthrough]];
    case Command::SaveAs:
        return Ask(Command::SaveAs, "save as", ReplaceExtension(path, "") + "-new.json");
    case Command::Open:
        return Ask(command, "open", std::filesystem::path(path).parent_path() / "");
    case Command::ExportView:
        return Ask(command, "export what is seen to", ReplaceExtension(path, "png"));
    case Command::ExportPage:
        return Ask(command, "export the page to", ReplaceExtension(path, "png"));
    case Command::Delete:
        return mTools.DeleteSelected();
    case Command::ZoomIn:
        return Zoom(x, y, kZoomStep);
    case Command::ZoomOut:
        return Zoom(x, y, 1 / kZoomStep);
    case Command::ZoomOne:
        return Zoom(x, y, 1 / mView.zoom);
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
    mDocument.Run([bitmap, path]() -> PageStore::Report {
        std::string reason;
        if (!SaveBitmap(*bitmap, path, 90, &reason))
            return {true, false, "cannot export " + path + ": " + reason, {}};
        return {false, false, "exported " + path, {}};
    });
}

void Notebook::Drop(std::string const& file, float x, float y) {
    mIsDirty = true;
    std::string path = file.rfind("file://", 0) == 0 ? file.substr(7) : file;
    path = std::filesystem::absolute(path).lexically_normal().string();
    if (std::filesystem::path(path).extension() == ".json") return static_cast<void>(mDocument.Open(path));
    Insert(path, mView.ToPage(x, std::max(y, static_cast<float>(mView.top))));
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
