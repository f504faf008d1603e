// StandardStreams.h: "-" in place of a file's name: standard input or output.
// Fails: throws Failure.
#pragma once

#include <memory>
#include <string>

namespace Moka::Tool {

inline bool IsStandardStream(std::string const& name) { return name == "-"; }

// A file to read by its path. Of "-" the path leads to a copy in memory of all that standard input has.
class InputFile {
public:
    explicit InputFile(std::string const& name);
    ~InputFile();
    InputFile(InputFile const&) = delete;
    InputFile& operator=(InputFile const&) = delete;

    std::string const& GetPath() const { return mPath; }
    // For people.
    std::string const& GetName() const { return mName; }
    // A message about the path, as one about the name.
    std::string Explain(std::string const& message) const;

private:
    int mCopy = -1;
    std::string mName;
    std::string mPath;
};

// A file to write by its path. Of "-" the path is a temporary one: Take() keeps what was saved there and removes
// its name, Send() writes it to standard output. Of any other name both do nothing.
class OutputFile {
public:
    // format is the extension of what goes to standard output.
    OutputFile(std::string const& name, std::string const& format);
    ~OutputFile();
    OutputFile(OutputFile const&) = delete;
    OutputFile& operator=(OutputFile const&) = delete;

    std::string const& GetPath() const { return mPath; }
    bool IsStream() const { return mIsStream; }
    // Within the scope that guards the saving, so that an interruption leaves nothing.
    void Take();
    void Send() const;

private:
    bool mIsStream;
    int mContent = -1;
    std::string mPath;
};

} // namespace Moka::Tool
