#include "tests/support/LogCapture.h"

#include <algorithm>
#include <utility>

namespace Moka::Testing {

LogCapture::LogCapture() {
    mPrevious = SetLogSink([this](LogLine const& line) {
        std::lock_guard<std::mutex> lock(mMutex);
        mLines.push_back(line);
    });
}

LogCapture::~LogCapture() { SetLogSink(std::move(mPrevious)); }

std::vector<LogLine> LogCapture::GetLines() const {
    std::lock_guard<std::mutex> lock(mMutex);
    return mLines;
}

std::vector<std::string> LogCapture::GetTexts(int priority) const {
    std::vector<std::string> texts;
    for (LogLine const& line : GetLines()) {
        if (line.priority == priority) texts.push_back(line.text);
    }
    return texts;
}

std::vector<std::string> LogCapture::GetTexts() const {
    std::vector<std::string> texts;
    for (LogLine const& line : GetLines()) texts.push_back(line.text);
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
    std::lock_guard<std::mutex> lock(mMutex);
    auto const found =
        std::find_if(mLines.begin(), mLines.end(), [&](LogLine const& line) { return line.text == text; });
    return found == mLines.end() ? LogLine{} : *found;
}

void LogCapture::Clear() {
    std::lock_guard<std::mutex> lock(mMutex);
    mLines.clear();
}

} // namespace Moka::Testing
