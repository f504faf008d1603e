#include "tests/app/MokaProcess.h"

#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <fcntl.h>
#include <sys/mman.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <system_error>
#include <unistd.h>

namespace Moka::Testing {
namespace {

// In memory, so that a limit on the size of files does not reach what the tool prints... unless it prints a
// lot.
int MakeCapture(char const* name) { return memfd_create(name, MFD_CLOEXEC); }

std::string ReadAll(int file) {
    std::string text;
    char block[4096];
    // The place in the file is the process's own.
    for (ssize_t got = 0; (got = pread(file, block, sizeof(block), static_cast<off_t>(text.size()))) > 0;)
        text.append(block, static_cast<std::size_t>(got));
    return text;
}

} // namespace

MokaProcess::MokaProcess(std::string folder, std::vector<std::string> arguments, ProcessOptions options)
    : mFolder(std::move(folder)), mOut(MakeCapture("out")), mErr(MakeCapture("err")), mPid(fork()) {
    if (mPid < 0) throw std::system_error(errno, std::generic_category(), "no process can be started");
    if (mPid == 0) RunChild(arguments, options);
}

MokaProcess::~MokaProcess() {
    if (mPid > 0) {
        kill(mPid, SIGKILL);
        waitpid(mPid, nullptr, 0);
    }
    close(mOut);
    close(mErr);
}

void MokaProcess::RunChild(std::vector<std::string> const& arguments, ProcessOptions const& options) const {
    std::vector<char*> argv{const_cast<char*>("moka")};
    for (std::string const& argument : arguments) argv.push_back(const_cast<char*>(argument.c_str()));
    argv.push_back(nullptr);
    for (std::string const& variable : options.environment) putenv(const_cast<char*>(variable.c_str()));
    int const out = options.out.empty() ? mOut : open(options.out.c_str(), O_WRONLY);
    dup2(out, STDOUT_FILENO);
    if (!options.in.empty()) dup2(open(options.in.c_str(), O_RDONLY), STDIN_FILENO);
    dup2(mErr, STDERR_FILENO);
    // A shell's background job ignores some, and so would the program.
    for (int const number : {SIGINT, SIGTERM, SIGHUP})
        std::signal(number, number == options.ignoredSignal ? SIG_IGN : SIG_DFL);
    if (chdir(mFolder.c_str()) != 0) _exit(126);
    if (options.fileSizeLimit > 0) {
        auto const limit = static_cast<rlim_t>(options.fileSizeLimit);
        rlimit const both{limit, limit};
        setrlimit(RLIMIT_FSIZE, &both);
    }
    execv(options.program.c_str(), argv.data());
    _exit(127);
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
