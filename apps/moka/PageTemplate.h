// PageTemplate.h: a text with gaps, filled from values:
//     {{name}}                the value, escaped for HTML
//     {{#list}}...{{/list}}   once for each item of the list; names are looked up in the item, then around it
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

// A name without a value is an empty text or list.
std::string FillPage(std::string_view page, PageValues const& values);

} // namespace Moka::Tool
