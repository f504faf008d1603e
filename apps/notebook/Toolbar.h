// Toolbar: the row of buttons above the page, drawn by the library.
// Units: the window's pixels.
#pragma once

#include "apps/notebook/Tools.h"

#include <vector>

namespace Moka::Notebook {

enum class Command {
    None,
    Undo,
    Redo,
    Save,
    SaveAs,
    Open,
    ExportView,
    ExportPage,
    Delete,
    ZoomIn,
    ZoomOut,
    ZoomOne
};

class Toolbar {
public:
    static constexpr int kHeight = 52;

    Toolbar();

    // Chooses a tool, a colour or a width itself; the rest is a command for the caller.
    Command Press(float x, Tools& tools) const;
    // status stands at the right.
    void Draw(IMKCanvas& canvas, int width, Tools const& tools, Page const& page,
              std::string const& status) const;

private:
    struct Button {
        enum Kind { ChooseTool, ChooseColor, ChooseWidth, GiveCommand } kind;
        int value; // of the kind's enumeration, or an index
        char const* label;
        float left;
        float width;
    };

    void Add(Button::Kind kind, int value, char const* label, float width);
    static void DrawIcon(IMKCanvas& canvas, Button const& button, bool isEnabled);
    static bool IsChosen(Button const& button, Tools const& tools);

    std::vector<Button> mButtons;
    float mEnd = 8;
};

} // namespace Moka::Notebook
