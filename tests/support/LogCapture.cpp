#include "tests/support/LogCapture.h"

#include <algorithm>
#include <utility>

namespace Moka::Testing {

LogCapture::LogCapture() {
    mPrevious = SetLogSink(
        [this](LogLine const& line) { mLines.Update([&](auto& lines) { lines.push_back(line); }); });
}

LogCapture::~LogCapture() { SetLogSink(std::move(mPrevious)); }

std::vector<std::string> LogCapture::GetTexts(int priority) const {
    std::vector<std::string> texts;
    for (LogLine const& line : GetLines()) {
        if (priority == kAll || line.priority == priority) texts.push_back(line.text);
    }
    return texts;
}

int LogCapture::Count(int priority, std::string const& part) const {
    std::vector<std::string> const texts = GetTexts(priority);
    return static_cast<int>(std::count_if(texts.begin(), texts.end(), [&](std::string const& text) {
        return text.find(part) != std::string::npos;
    }));
}

bool LogCapture::Has(std::string const& text) const { return Find(text).priority != 0; }

LogLine LogCapture::Find(std::string const& text) const {
    for (LogLine const& line : GetLines()) {
        if (line.text == text) return line;
    }
    return {};
}

void LogCapture::AwaitLines(std::string const& part, int count) const {
    Await([&](std::vector<LogLine> const& lines) {
        return count <= std::count_if(lines.begin(), lines.end(), [&](LogLine const& line) {
                   return line.text.find(part) != std::string::npos;
               });
    });
}

} // namespace Moka::Testing
