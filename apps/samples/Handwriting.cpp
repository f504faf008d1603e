#include "apps/samples/Ink.h"
#include "apps/samples/Letters.h"

namespace Moka::Samples {
namespace {

// Down strokes press harder than up strokes.
void Press(Stroke& stroke, float width) {
    for (std::size_t i = 0; i + 1 < stroke.size(); ++i) {
        float const dx = stroke[i + 1].at.x - stroke[i].at.x;
        float const dy = stroke[i + 1].at.y - stroke[i].at.y;
        float const down = dy / std::max(std::hypot(dx, dy), 0.001f);
        float const wanted = width * (1 + 0.3f * down);
        stroke[i].width = i == 0 ? wanted : Mix(stroke[i - 1].width, wanted, 0.25f);
    }
    if (stroke.size() > 1) stroke.back().width = stroke[stroke.size() - 2].width * 0.8f;
}

// These begin at the top, on the right: a stroke that came from the letter before would cross them.
bool IsRound(char character) { return std::string("acdgo").find(character) != std::string::npos; }

// Writes one word: collects the pen's path up to where it lifts, and adds the accents when the word is
// finished.
class Word {
public:
    Word(Picture& picture, Pen const& pen, float baseline)
        : mPicture(picture), mPen(pen), mBaseline(baseline) {}

    void Add(Letter const& letter, float x, int index) {
        if (IsRound(letter.character)) Lift();
        float const lift = 0.07f * (Hash(index, 0, mPen.seed) - 0.5f);
        float const size = 1 + 0.1f * (Hash(index, 1, mPen.seed) - 0.5f);
        auto const place = [&](Spot p) {
            float const y = p.y * size + lift;
            return Spot{x + (p.x * size + y * mPen.slant) * mPen.xHeight, mBaseline - y * mPen.xHeight};
        };
        for (Spot const& p : letter.body) mPath.push_back(place(p));
        if (letter.accent.empty()) return;
        std::vector<Spot> accent;
        for (Spot const& p : letter.accent) accent.push_back(place(p));
        mAccents.push_back(accent);
    }

    void Draw() {
        Lift();
        for (std::vector<Spot> const& accent : mAccents) Trace(accent);
        mAccents.clear();
    }

private:
    void Lift() {
        Trace(mPath);
        mPath.clear();
    }

    void Trace(std::vector<Spot> const& path) {
        Stroke stroke = SmoothThrough(path, mPen.width);
        Press(stroke, mPen.width);
        DrawStroke(mPicture, stroke, mPen.color);
    }

    Picture& mPicture;
    Pen const& mPen;
    float mBaseline;
    std::vector<Spot> mPath;
    std::vector<std::vector<Spot>> mAccents;
};

} // namespace

float Write(Picture& picture, std::string const& text, Spot at, Pen const& pen) {
    Word word(picture, pen, at.y);
    float x = at.x;
    for (std::size_t i = 0; i < text.size(); ++i) {
        Letter const* const letter = FindLetter(text[i]);
        if (letter) {
            word.Add(*letter, x, static_cast<int>(i));
            x += letter->advance * pen.xHeight;
        } else {
            word.Draw();
            x += 0.75f * pen.xHeight;
        }
    }
    word.Draw();
    return x;
}

} // namespace Moka::Samples
