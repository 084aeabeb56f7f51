#pragma once

#include <stdexcept>
#include <string>

namespace vexa::client {

inline constexpr int kExitOk = 0;
inline constexpr int kExitFailed = 1;
inline constexpr int kExitWrongUse = 2;
inline constexpr int kExitNotStarted = 3;

/// Ends the command: one line for standard error and the exit code.
class ClientError : public std::runtime_error {
public:
    explicit ClientError(const std::string& line, int exitCode = kExitFailed)
        : std::runtime_error(line), m_exitCode(exitCode) {}

    int exitCode() const { return m_exitCode; }

private:
    int m_exitCode;
};

/// The service has gone, or says nothing: what was asked of it may be done or not.
class NoAnswer : public ClientError {
public:
    using ClientError::ClientError;
};

/// The user has had enough of waiting.
class StoppedByUser : public NoAnswer {
public:
    using NoAnswer::NoAnswer;
};

}  // namespace vexa::client
