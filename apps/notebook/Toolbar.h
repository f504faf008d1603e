// Toolbar: the row of buttons above the page, drawn by the library, and what buttons and keys command.
// Units: the window's pixels.
#pragma once

#include "apps/notebook/Tools.h"

#include <string>
#include <vector>

namespace Moka::Notebook {

enum class Command {
    None,
    Choose, // a tool, by its number
    SetColor,
    SetWidth,
    Undo,
    Redo,
    Save,
    SaveAs,
    Open,
    ExportView,
    ExportPage,
    Paste,
    Delete,
    Escape,
    Quit,
    ZoomBy, // so many hundredths
    ZoomOne,
    ScrollAcross, // by so many pixels
    ScrollDown,
    ScrollPages // by so many tenths of what is seen
};

struct Action {
    Command command = Command::None;
    int value = 0;
};

class Toolbar {
public:
    static constexpr int kHeight = 52;

    Toolbar();

    Action Find(float x) const;
    // status stands at the right.
    void Draw(IMKCanvas& canvas, int width, Tools const& tools, Page const& page,
              std::string const& status) const;

private:
    struct Button {
        Action action; // a width's value is in tenths
        char const* label;
        bool isIcon;
        float left;
        float width;
    };

    void Add(Action action, char const* label, bool isIcon, float width);
    static bool IsChosen(Action const& action, Tools const& tools);

    std::vector<Button> mButtons;
    float mEnd = 8;
};

} // namespace Moka::Notebook
