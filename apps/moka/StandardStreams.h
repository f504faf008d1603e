// StandardStreams.h: support for "-" as the name of standard input or output.
// Fails: throws Failure.
#pragma once

#include <memory>
#include <string>

namespace Moka::Tool {

inline bool IsStandardStream(std::string const& name) { return name == "-"; }

// A file to read by its path. For "-", the path refers to a copy of standard input in memory.
class InputFile {
public:
    explicit InputFile(std::string const& name);
    ~InputFile();
    InputFile(InputFile const&) = delete;
    InputFile& operator=(InputFile const&) = delete;

    std::string const& GetPath() const { return mPath; }
    // The name for messages.
    std::string const& GetName() const { return mName; }
    // Replaces the path in a message by the name.
    std::string Explain(std::string const& message) const;

private:
    int mCopy = -1;
    std::string mName;
    std::string mPath;
};

// A file to write by its path. For "-", the path is a temporary one: Take() opens the saved file and removes
// its name, and Send() writes it to standard output. For other names both do nothing.
class OutputFile {
public:
    // format is the extension for standard output.
    OutputFile(std::string const& name, std::string const& format);
    ~OutputFile();
    OutputFile(OutputFile const&) = delete;
    OutputFile& operator=(OutputFile const&) = delete;

    std::string const& GetPath() const { return mPath; }
    bool IsStream() const { return mIsStream; }
    // Call this inside the Saving scope, so that an interruption leaves no file.
    void Take();
    void Send() const;

private:
    bool mIsStream;
    int mContent = -1;
    std::string mPath;
};

} // namespace Moka::Tool
