#include "apps/notebook/Toolbar.h"

#include "apps/notebook/Lettering.h"

namespace Moka::Notebook {
namespace {

constexpr unsigned kColors[] = {0x1B2A41, 0xC0392B, 0x1F77B4, 0x2E8B57, 0xF5D020, 0xE8A030, 0x8E44AD};
constexpr float kWidths[] = {1.5f, 3, 6};
constexpr unsigned kInk = 0xFF33404F;
constexpr unsigned kFaint = 0xFFB4BDC8;
constexpr unsigned kChosen = 0xFFD5E4F5;
constexpr float kLetter = 1.7f;
constexpr float kSpace = 10;
constexpr float kMiddle = Toolbar::kHeight / 2.0f;

MKPaint MakeLine(unsigned argb, float width) {
    MKPaint paint = MakePaint(argb);
    paint.SetStyle(MKPaint::Stroke);
    paint.SetLineWidth(width);
    paint.SetLineCapType(MKPaint::Round);
    return paint;
}

void DrawArrow(IMKCanvas& canvas, float x, float towards, unsigned argb) {
    MKPaint const line = MakeLine(argb, 2.5f);
    canvas.DrawLine(x - 9 * towards, kMiddle + 6, x + 2 * towards, kMiddle + 6, &line);
    canvas.DrawLine(x + 2 * towards, kMiddle + 6, x + 8 * towards, kMiddle, &line);
    canvas.DrawLine(x + 8 * towards, kMiddle, x + 2 * towards, kMiddle - 6, &line);
    canvas.DrawLine(x + 2 * towards, kMiddle - 6, x - 6 * towards, kMiddle - 6, &line);
    canvas.DrawLine(x - 9 * towards, kMiddle - 6, x - 4 * towards, kMiddle - 10, &line);
    canvas.DrawLine(x - 9 * towards, kMiddle - 6, x - 4 * towards, kMiddle - 2, &line);
}

void DrawTool(IMKCanvas& canvas, float x, Tool tool) {
    float const y = kMiddle;
    MKPaint const thin = MakeLine(kInk, 2);
    MKPaint const body = MakeLine(kInk, 6);
    MKPaint const light = MakeLine(0x90F0C000, 12);
    MKPaint const rubber = MakePaint(0xFFE79AA8);
    switch (tool) {
    case Tool::Pen:
        canvas.DrawLine(x - 3, y + 3, x + 9, y - 9, &body);
        canvas.DrawLine(x - 9, y + 10, x - 4, y + 4, &thin);
        break;
    case Tool::Highlighter:
        canvas.DrawLine(x - 9, y + 7, x + 9, y + 7, &light);
        canvas.DrawLine(x - 3, y + 2, x + 7, y - 9, &body);
        break;
    case Tool::StrokeEraser:
    case Tool::PartEraser:
        canvas.DrawRoundRect(x - 11, y - 7, x + 11, y + 7, 4, 4, &rubber);
        if (tool == Tool::PartEraser) canvas.DrawRect(x - 2, y - 12, x + 3, y + 12, &rubber);
        canvas.DrawLine(x - 12, y + 12, x + 12, y + 12, &thin);
        break;
    case Tool::Select: {
        MKPaint loop = MakeLine(kInk, 2);
        loop.SetDashedLinePattern(Vector2<float>{4, 4});
        canvas.DrawLine(x - 10, y - 8, x + 10, y - 8, &loop);
        canvas.DrawLine(x + 10, y - 8, x + 10, y + 8, &loop);
        canvas.DrawLine(x + 10, y + 8, x - 10, y + 8, &loop);
        canvas.DrawLine(x - 10, y + 8, x - 10, y - 8, &loop);
        break;
    }
    }
}

} // namespace

Toolbar::Toolbar() {
    for (Tool const tool : {Tool::Pen, Tool::Highlighter, Tool::StrokeEraser, Tool::PartEraser, Tool::Select})
        Add(Button::ChooseTool, static_cast<int>(tool), "", 42);
    mEnd += kSpace;
    for (int i = 0; i < static_cast<int>(std::size(kColors)); ++i) Add(Button::ChooseColor, i, "", 32);
    mEnd += kSpace;
    for (int i = 0; i < static_cast<int>(std::size(kWidths)); ++i) Add(Button::ChooseWidth, i, "", 34);
    mEnd += kSpace;
    auto const add = [this](Command command, char const* label) {
        float const width = label[0] ? MeasureLetters(label, kLetter) + 16 : 42;
        Add(Button::GiveCommand, static_cast<int>(command), label, width);
    };
    add(Command::Undo, "");
    add(Command::Redo, "");
    mEnd += kSpace;
    add(Command::ZoomOut, "-");
    add(Command::ZoomOne, "1:1");
    add(Command::ZoomIn, "+");
    mEnd += kSpace;
    add(Command::Open, "Open");
    add(Command::Save, "Save");
    add(Command::ExportPage, "Export");
}

void Toolbar::Add(Button::Kind kind, int value, char const* label, float width) {
    mButtons.push_back({kind, value, label, mEnd, width});
    mEnd += width + 2;
}

Command Toolbar::Press(float x, Tools& tools) const {
    for (Button const& button : mButtons) {
        if (x < button.left || x >= button.left + button.width) continue;
        auto const index = static_cast<std::size_t>(button.value);
        switch (button.kind) {
        case Button::ChooseTool:
            tools.Choose(static_cast<Tool>(button.value));
            break;
        case Button::ChooseColor:
            tools.SetColor(kColors[index]);
            break;
        case Button::ChooseWidth:
            tools.SetWidth(kWidths[index]);
            break;
        case Button::GiveCommand:
            return static_cast<Command>(button.value);
        }
    }
    return Command::None;
}

bool Toolbar::IsChosen(Button const& button, Tools const& tools) {
    auto const index = static_cast<std::size_t>(button.value);
    switch (button.kind) {
    case Button::ChooseTool:
        return tools.GetTool() == static_cast<Tool>(button.value);
    case Button::ChooseColor:
        return tools.GetColor() == kColors[index];
    case Button::ChooseWidth:
        return tools.GetWidth() == kWidths[index];
    case Button::GiveCommand:
        break;
    }
    return false;
}

void Toolbar::DrawIcon(IMKCanvas& canvas, Button const& button, bool isEnabled) {
    float const x = button.left + button.width / 2;
    auto const index = static_cast<std::size_t>(button.value);
    unsigned const ink = isEnabled ? kInk : kFaint;
    if (button.kind == Button::ChooseTool) return DrawTool(canvas, x, static_cast<Tool>(button.value));
    if (button.kind == Button::GiveCommand && button.label[0]) {
        float const y = kMiddle - 3 * kLetter;
        return DrawLetters(canvas, button.label, button.left + 8, y, kLetter, ink);
    }
    if (button.kind == Button::GiveCommand)
        return DrawArrow(canvas, x, static_cast<Command>(button.value) == Command::Undo ? 1.0f : -1.0f, ink);
    bool const isColor = button.kind == Button::ChooseColor;
    MKPaint const dot = MakePaint(isColor ? 0xFF000000 | kColors[index] : kInk);
    canvas.DrawCircle(x, kMiddle, isColor ? 10 : kWidths[index] + 1, &dot);
}

void Toolbar::Draw(IMKCanvas& canvas, int width, Tools const& tools, Page const& page,
                   std::string const& status) const {
    MKPaint const back = MakePaint(0xFFF3F5F8);
    canvas.DrawRect(0, 0, static_cast<float>(width), kHeight, &back);
    MKPaint const edge = MakePaint(0xFFC9D1DA);
    canvas.DrawRect(0, kHeight - 1, static_cast<float>(width), kHeight, &edge);
    MKPaint const chosen = MakePaint(kChosen);
    for (Button const& button : mButtons) {
        if (IsChosen(button, tools))
            canvas.DrawRoundRect(button.left, 5, button.left + button.width, kHeight - 6, 7, 7, &chosen);
        auto const command = static_cast<Command>(button.value);
        bool const isOff =
            button.kind == Button::GiveCommand &&
            ((command == Command::Undo && !page.CanUndo()) || (command == Command::Redo && !page.CanRedo()));
        DrawIcon(canvas, button, !isOff);
    }
    float const left = static_cast<float>(width) - MeasureLetters(status, kLetter) - 8;
    if (left > mEnd) DrawLetters(canvas, status, left, kMiddle - 3 * kLetter, kLetter, kInk);
}

} // namespace Moka::Notebook
