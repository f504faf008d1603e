#include "apps/moka/PageTemplate.h"

namespace Moka::Tool {
namespace {

// The values of the enclosing lists, outermost first.
using Scope = std::vector<PageValues const*>;

std::string Escape(std::string const& text) {
    std::string escaped;
    for (char const c : text) {
        switch (c) {
        case '&':
            escaped += "&amp;";
            break;
        case '<':
            escaped += "&lt;";
            break;
        case '>':
            escaped += "&gt;";
            break;
        case '"':
            escaped += "&quot;";
            break;
        default:
            escaped += c;
        }
    }
    return escaped;
}

// Returns the innermost value of this name.
template <class Map>
typename Map::mapped_type const* Find(Scope const& scope, Map PageValues::*map, std::string const& name) {
    for (auto values = scope.rbegin(); values != scope.rend(); ++values) {
        auto const found = ((*values)->*map).find(name);
        if (found != ((*values)->*map).end()) return &found->second;
    }
    return nullptr;
}

std::string Fill(std::string_view page, Scope& scope) {
    std::string filled;
    while (true) {
        std::size_t const begin = page.find("{{");
        std::size_t const end = page.find("}}", begin);
        if (begin == std::string_view::npos || end == std::string_view::npos) return filled.append(page);
        filled.append(page.substr(0, begin));
        std::string name(page.substr(begin + 2, end - begin - 2));
        page.remove_prefix(end + 2);
        if (name.empty() || name.front() != '#') {
            if (auto const* const text = Find(scope, &PageValues::texts, name)) filled += Escape(*text);
            continue;
        }
        name.erase(0, 1);
        std::string const close = "{{/" + name + "}}";
        std::size_t const length = page.find(close);
        if (auto const* const list = Find(scope, &PageValues::lists, name)) {
            for (PageValues const& item : *list) {
                scope.push_back(&item);
                filled += Fill(page.substr(0, length), scope);
                scope.pop_back();
            }
        }
        page.remove_prefix(length + close.size());
    }
}

} // namespace

std::string FillPage(std::string_view page, PageValues const& values) {
    Scope scope{&values};
    return Fill(page, scope);
}

} // namespace Moka::Tool
