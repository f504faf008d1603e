#include "apps/notebook/Toolbar.h"

#include "apps/notebook/Lettering.h"

namespace Moka::Notebook {
namespace {

constexpr int kColors[] = {0x1B2A41, 0xC0392B, 0x1F77B4, 0x2E8B57, 0xF5D020, 0xE8A030, 0x8E44AD};
constexpr int kWidths[] = {15, 30, 60}; // tenths of a pixel
constexpr unsigned kInk = 0xFF33404F;
constexpr unsigned kFaint = 0xFFB4BDC8;
constexpr unsigned kChosen = 0xFFD5E4F5;
constexpr float kLetter = 1.7f;
constexpr float kIcon = 2.4f;
constexpr float kSpace = 10;
constexpr float kMiddle = Toolbar::kHeight / 2.0f;

} // namespace

Toolbar::Toolbar() {
    auto const word = [this](Action action, char const* label) {
        Add(action, label, false, MeasureLetters(label, kLetter) + 16);
    };
    for (int tool = 0; tool < static_cast<int>(std::size(kToolIcons)); ++tool)
        Add({Command::Choose, tool}, kToolIcons[tool], true, 42);
    mEnd += kSpace;
    for (int const color : kColors) Add({Command::SetColor, color}, "", false, 32);
    mEnd += kSpace;
    for (int const width : kWidths) Add({Command::SetWidth, width}, "", false, 34);
    mEnd += kSpace;
    Add({Command::Undo}, kUndoIcon, true, 42);
    Add({Command::Redo}, kRedoIcon, true, 42);
    mEnd += kSpace;
    word({Command::ZoomBy, 80}, "-");
    word({Command::ZoomOne}, "1:1");
    word({Command::ZoomBy, 125}, "+");
    mEnd += kSpace;
    word({Command::Open}, "Open");
    word({Command::Save}, "Save");
    word({Command::ExportPage}, "Export");
}

void Toolbar::Add(Action action, char const* label, bool isIcon, float width) {
    mButtons.push_back({action, label, isIcon, mEnd, width});
    mEnd += width + 2;
}

Action Toolbar::Find(float x) const {
    for (Button const& button : mButtons)
        if (x >= button.left && x < button.left + button.width) return button.action;
    return {};
}

bool Toolbar::IsChosen(Action const& action, Tools const& tools) {
    return (action.command == Command::Choose && static_cast<int>(tools.GetTool()) == action.value) ||
           (action.command == Command::SetColor && static_cast<int>(tools.GetColor()) == action.value) ||
           (action.command == Command::SetWidth && tools.GetWidth() * 10 == static_cast<float>(action.value));
}

void Toolbar::Draw(IMKCanvas& canvas, int width, Tools const& tools, Page const& page,
                   std::string const& status) const {
    MKPaint const back = MakePaint(0xFFF3F5F8);
    canvas.DrawRect(0, 0, static_cast<float>(width), kHeight, &back);
    MKPaint const edge = MakePaint(0xFFC9D1DA);
    canvas.DrawRect(0, kHeight - 1, static_cast<float>(width), kHeight, &edge);
    MKPaint const chosen = MakePaint(kChosen);
    for (Button const& button : mButtons) {
        auto const [command, value] = button.action;
        if (IsChosen(button.action, tools))
            canvas.DrawRoundRect(button.left, 5, button.left + button.width, kHeight - 6, 7, 7, &chosen);
        bool const isOff =
            (command == Command::Undo && !page.CanUndo()) || (command == Command::Redo && !page.CanRedo());
        float const unit = button.isIcon ? kIcon : kLetter;
        float const left =
            button.isIcon ? button.left + (button.width - kIconSide * unit) / 2 : button.left + 8;
        float const half = (button.isIcon ? kIconSide / 2 : 3) * unit;
        DrawLetters(canvas, button.label, left, kMiddle - half, unit, isOff ? kFaint : kInk);
        if (command != Command::SetColor && command != Command::SetWidth) continue;
        bool const isColor = command == Command::SetColor;
        MKPaint const dot = MakePaint(isColor ? 0xFF000000 | static_cast<unsigned>(value) : kInk);
        float const radius = isColor ? 10 : static_cast<float>(value) / 10 + 1;
        canvas.DrawCircle(button.left + button.width / 2, kMiddle, radius, &dot);
    }
    float const left = static_cast<float>(width) - MeasureLetters(status, kLetter) - 8;
    if (left > mEnd) DrawLetters(canvas, status, left, kMiddle - 3 * kLetter, kLetter, kInk);
}

} // namespace Moka::Notebook
