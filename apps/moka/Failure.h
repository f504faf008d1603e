// Failure: what ends a command: one line for the person who typed it, and the exit status.
#pragma once

#include <stdexcept>
#include <string>

namespace Moka::Tool {

enum class ExitStatus { Failed = 1, Usage = 2 };

class Failure : public std::runtime_error {
public:
    // An empty message has been told already.
    Failure(ExitStatus status, std::string const& message)
        : std::runtime_error(message), mStatus(static_cast<int>(status)) {}
    explicit Failure(std::string const& message) : Failure(ExitStatus::Failed, message) {}

    int GetStatus() const { return mStatus; }

private:
    int mStatus;
};

// "cannot read image 'path': reason", or what else the library could not do; without a reason only that.
std::string TellCannot(char const* action, std::string const& path, std::string const& reason);

// "moka: message" on stderr, as one line whatever is in it.
void PrintError(std::string const& message);

} // namespace Moka::Tool
