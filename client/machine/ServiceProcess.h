#pragma once

#include <filesystem>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace vexa::client {

/// What to start. A variable without a value is removed from the environment.
struct ServiceProgram {
    std::filesystem::path executable;
    std::vector<std::string> arguments;
    std::map<std::string, std::optional<std::string>> variables;
    std::filesystem::path outputFile;
};

/// The service as a child process. It gets standard error and nothing else of ours; a Ctrl-C in the terminal
/// reaches its parent alone.
class ServiceProcess {
public:
    /// Throws ClientError if the program cannot be started.
    explicit ServiceProcess(const ServiceProgram& program);
    ~ServiceProcess();
    ServiceProcess(const ServiceProcess&) = delete;
    ServiceProcess& operator=(const ServiceProcess&) = delete;

    /// How it ended: its exit code, or 128 + N if signal N killed it. Nothing while it runs. Never waits.
    std::optional<int> exitCode();

    /// Kills it with all that it has started, and waits for its end.
    void kill();

private:
    struct State;
    std::unique_ptr<State> m_state;
    std::optional<int> m_exitCode;
};

}  // namespace vexa::client
