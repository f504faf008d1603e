// NotebookObjects.h: creates and compares objects of a page.
#pragma once

#include "apps/notebook/Page.h"

#include <memory>
#include <utility>

namespace Moka::Testing {

using namespace Moka::Notebook;

inline ObjectPtr MakeStroke(InkPoints points, unsigned argb = 0xFF102030) {
    return std::make_shared<Object const>(Stroke{std::move(points), argb});
}

// A stroke from (x, y) to (x + 100, y), 4 pixels wide.
inline ObjectPtr MakeDash(float x, float y) { return MakeStroke({{x, y, 4}, {x + 100, y, 4}}); }

// Compares contents, not addresses.
inline bool AreSame(Objects const& a, Objects const& b) {
    auto const isSame = [](ObjectPtr const& p, ObjectPtr const& q) {
        auto const* const s = std::get_if<Stroke>(&p->content);
        auto const* const t = std::get_if<Stroke>(&q->content);
        if (s && t) return s->points == t->points && s->argb == t->argb;
        if (s || t) return false;
        Image const& i = std::get<Image>(p->content);
        Image const& j = std::get<Image>(q->content);
        return i.file == j.file && i.place == j.place;
    };
    return std::equal(a.begin(), a.end(), b.begin(), b.end(), isSame);
}

} // namespace Moka::Testing
