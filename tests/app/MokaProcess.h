// MokaProcess.h: runs a command of the shell as a person does, in a folder of its own.
#pragma once

#include <string>
#include <sys/types.h>

namespace Moka::Testing {

struct ProcessResult {
    int status = -1; // exit status, -1 when a signal ended it
    int signal = 0;
    std::string out;
    std::string err;
};

// A running program. Ended, if it still runs, with this object.
class MokaProcess {
public:
    // The command ends with "exec PROGRAM ARGUMENTS", so that signals reach the program.
    MokaProcess(std::string const& folder, std::string const& command);
    ~MokaProcess();
    MokaProcess(MokaProcess const&) = delete;
    MokaProcess& operator=(MokaProcess const&) = delete;

    void Signal(int signal) const;
    bool IsOver() const;
    // Its output on stderr so far.
    std::string GetError() const;
    ProcessResult Wait();

private:
    int mOut;
    int mErr;
    pid_t mPid;
};

} // namespace Moka::Testing
