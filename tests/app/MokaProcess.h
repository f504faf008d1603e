// MokaProcess.h: runs the command-line tool, or another program, as a person does, in a folder of its own.
#pragma once

#include <string>
#include <sys/types.h>
#include <vector>

namespace Moka::Testing {

struct ProcessResult {
    int status = -1; // exit status, -1 when a signal ended it
    int signal = 0;
    std::string out;
    std::string err;
};

struct ProcessOptions {
    std::string program = MOKA_EXECUTABLE;
    std::vector<std::string> environment; // "NAME=value", beside what the test has
    long fileSizeLimit = 0;               // bytes; 0 for none
    std::string out;                      // a file to use as stdout
    std::string in;                       // a file to use as stdin
    int ignoredSignal = 0;                // all others have their defaults, whatever the test's own are
};

// A running tool. Ended, if it still runs, with this object.
class MokaProcess {
public:
    MokaProcess(std::string folder, std::vector<std::string> arguments, ProcessOptions options = {});
    ~MokaProcess();
    MokaProcess(MokaProcess const&) = delete;
    MokaProcess& operator=(MokaProcess const&) = delete;

    void Signal(int signal) const;
    bool IsOver() const;
    // Its output on stderr so far.
    std::string GetError() const;
    ProcessResult Wait();

private:
    [[noreturn]] void RunChild(std::vector<std::string> const& arguments,
                               ProcessOptions const& options) const;

    std::string const mFolder;
    int mOut;
    int mErr;
    pid_t mPid;
};

} // namespace Moka::Testing
