// Failure: the exception that ends a command: a message of one line, and the exit status.
#pragma once

#include <stdexcept>
#include <string>

namespace Moka::Tool {

enum class ExitStatus { Failed = 1, Usage = 2 };

class Failure : public std::runtime_error {
public:
    // An empty message means that the error was printed already.
    Failure(ExitStatus status, std::string const& message)
        : std::runtime_error(message), mStatus(static_cast<int>(status)) {}
    explicit Failure(std::string const& message) : Failure(ExitStatus::Failed, message) {}

    int GetStatus() const { return mStatus; }

private:
    int mStatus;
};

// Returns "cannot <action> image 'path': reason", without the reason if it is empty.
std::string TellCannot(char const* action, std::string const& path, std::string const& reason);

// Prints "moka: message" to stderr as one line. Control characters are replaced.
void PrintError(std::string const& message);

} // namespace Moka::Tool
