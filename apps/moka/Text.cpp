#include "apps/moka/Text.h"

#include "moka/base/String.h"

namespace Moka::Tool {

std::string MakePrintable(std::string const& text, char substitute) {
    std::string const utf8 = String(text).ToUtf8(); // malformed sequences become U+FFFD
    std::string printable;
    for (std::size_t i = 0; i < utf8.size(); ++i) {
        auto const byte = static_cast<unsigned char>(utf8[i]);
        // U+0080 to U+009F are control characters as well.
        bool const isLong = byte == 0xC2 && static_cast<unsigned char>(utf8[i + 1]) < 0xA0;
        bool const isControl = byte < ' ' || byte == 0x7F || isLong;
        printable.push_back(isControl ? substitute : utf8[i]);
        if (isLong) ++i;
    }
    return printable;
}

std::string ReplaceAll(std::string text, std::string const& part, std::string const& by) {
    for (std::size_t at = text.find(part); at != std::string::npos; at = text.find(part, at + by.size()))
        text.replace(at, part.size(), by);
    return text;
}

} // namespace Moka::Tool
