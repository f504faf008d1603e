#include "tests/app/MokaProcess.h"

#include <cerrno>
#include <csignal>
#include <sys/mman.h>
#include <sys/wait.h>
#include <system_error>
#include <unistd.h>

namespace Moka::Testing {
namespace {

std::string ReadAll(int file) {
    std::string text;
    char block[4096];
    // The place in the file is the process's own.
    for (ssize_t got = 0; (got = pread(file, block, sizeof(block), static_cast<off_t>(text.size()))) > 0;)
        text.append(block, static_cast<std::size_t>(got));
    return text;
}

} // namespace

// What it prints goes to memory, so a full disk keeps nothing of it.
MokaProcess::MokaProcess(std::string const& folder, std::string const& command)
    : mOut(memfd_create("out", MFD_CLOEXEC)), mErr(memfd_create("err", MFD_CLOEXEC)), mPid(fork()) {
    if (mPid < 0) throw std::system_error(errno, std::generic_category(), "no process can be started");
    if (mPid > 0) return;
    dup2(mOut, STDOUT_FILENO);
    dup2(mErr, STDERR_FILENO);
    // A shell's background job ignores some, and so would the program.
    for (int const number : {SIGINT, SIGTERM, SIGHUP}) std::signal(number, SIG_DFL);
    if (chdir(folder.c_str()) == 0) execl("/bin/sh", "sh", "-c", command.c_str(), nullptr);
    _exit(127);
}

MokaProcess::~MokaProcess() {
    if (mPid > 0) {
        kill(mPid, SIGKILL);
        waitpid(mPid, nullptr, 0);
    }
    close(mOut);
    close(mErr);
}

void MokaProcess::Signal(int signal) const {
    if (mPid > 0) kill(mPid, signal); // -1 would reach every process
}

bool MokaProcess::IsOver() const {
    siginfo_t info{};
    return waitid(P_PID, static_cast<id_t>(mPid), &info, WEXITED | WNOHANG | WNOWAIT) != 0 ||
           info.si_pid != 0;
}

std::string MokaProcess::GetError() const { return ReadAll(mErr); }

ProcessResult MokaProcess::Wait() {
    ProcessResult result;
    int status = 0;
    waitpid(mPid, &status, 0);
    mPid = -1;
    if (WIFEXITED(status)) result.status = WEXITSTATUS(status);
    if (WIFSIGNALED(status)) result.signal = WTERMSIG(status);
    result.out = ReadAll(mOut);
    result.err = ReadAll(mErr);
    return result;
}

} // namespace Moka::Testing
