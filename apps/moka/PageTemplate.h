// PageTemplate.h: replaces the placeholders of a template by values:
//     {{name}}                the value, escaped for HTML
//     {{#list}}...{{/list}}   repeated for each item of the list; names are looked up in the item, then in
//     the
//                             enclosing ones
#pragma once

#include <map>
#include <string>
#include <string_view>
#include <vector>

namespace Moka::Tool {

struct PageValues {
    std::map<std::string, std::string> texts;
    std::map<std::string, std::vector<PageValues>> lists;
};

// A name without a value is replaced by an empty text or list.
std::string FillPage(std::string_view page, PageValues const& values);

} // namespace Moka::Tool
