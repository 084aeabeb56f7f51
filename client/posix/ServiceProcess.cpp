#include "client/machine/ServiceProcess.h"

#include <fcntl.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <cstring>

#include "client/terminal/ClientError.h"

namespace vexa::client {

namespace {

/// What the child starts with: its three streams, no other descriptor (the mutex lives in one), default
/// signals.
class SpawnSetup {
public:
    explicit SpawnSetup(const std::filesystem::path& outputFile) {
        posix_spawn_file_actions_init(&m_files);
        posix_spawn_file_actions_addopen(&m_files, STDIN_FILENO, "/dev/null", O_RDONLY, 0);
        posix_spawn_file_actions_addopen(&m_files, STDOUT_FILENO, outputFile.c_str(),
                                         O_WRONLY | O_CREAT | O_TRUNC | O_APPEND, 0600);
        posix_spawn_file_actions_addclosefrom_np(&m_files, STDERR_FILENO + 1);
        sigset_t none;
        sigset_t all;
        sigemptyset(&none);
        sigfillset(&all);
        posix_spawnattr_init(&m_attributes);
        posix_spawnattr_setsigmask(&m_attributes, &none);
        posix_spawnattr_setsigdefault(&m_attributes, &all);
        posix_spawnattr_setpgroup(&m_attributes, 0);
        posix_spawnattr_setflags(&m_attributes,
                                 POSIX_SPAWN_SETSIGMASK | POSIX_SPAWN_SETSIGDEF | POSIX_SPAWN_SETPGROUP);
    }
    ~SpawnSetup() {
        posix_spawnattr_destroy(&m_attributes);
        posix_spawn_file_actions_destroy(&m_files);
    }
    SpawnSetup(const SpawnSetup&) = delete;
    SpawnSetup& operator=(const SpawnSetup&) = delete;

    int spawn(pid_t& pid, const std::string& executable, std::vector<std::string>& arguments,
              std::vector<std::string>& environment) {
        return posix_spawn(&pid, executable.c_str(), &m_files, &m_attributes, pointers(arguments).data(),
                           pointers(environment).data());
    }

private:
    static std::vector<char*> pointers(std::vector<std::string>& texts) {
        std::vector<char*> result;
        result.reserve(texts.size() + 1);
        for (std::string& text : texts)
            result.push_back(text.data());
        result.push_back(nullptr);
        return result;
    }

    posix_spawn_file_actions_t m_files{};
    posix_spawnattr_t m_attributes{};
};

std::vector<std::string> childEnvironment(const ServiceProgram& program) {
    std::vector<std::string> result;
    for (char** entry = environ; *entry != nullptr; ++entry) {
        const std::string text = *entry;
        if (!program.variables.contains(text.substr(0, text.find('=')))) result.push_back(text);
    }
    for (const auto& [name, value] : program.variables) {
        if (value) result.push_back(name + "=" + *value);
    }
    return result;
}

int decoded(int status) {
    return WIFSIGNALED(status) ? 128 + WTERMSIG(status) : WEXITSTATUS(status);
}

}  // namespace

struct ServiceProcess::State {
    pid_t pid = -1;
};

ServiceProcess::ServiceProcess(const ServiceProgram& program) : m_state(std::make_unique<State>()) {
    std::vector<std::string> arguments{program.executable.string()};
    arguments.insert(arguments.end(), program.arguments.begin(), program.arguments.end());
    std::vector<std::string> environment = childEnvironment(program);
    SpawnSetup setup(program.outputFile);
    const int error = setup.spawn(m_state->pid, program.executable.string(), arguments, environment);
    if (error != 0) {
        throw ClientError(
            "the service " + program.executable.string() + " cannot be started: " + std::strerror(error),
            kExitNotStarted);
    }
}

ServiceProcess::~ServiceProcess() {
    if (!exitCode()) kill();
}

std::optional<int> ServiceProcess::exitCode() {
    if (m_exitCode) return m_exitCode;
    int status = 0;
    if (::waitpid(m_state->pid, &status, WNOHANG) == m_state->pid) m_exitCode = decoded(status);
    return m_exitCode;
}

void ServiceProcess::kill() {
    if (m_exitCode) return;
    ::kill(-m_state->pid, SIGKILL);
    int status = 0;
    while (::waitpid(m_state->pid, &status, 0) < 0 && errno == EINTR) {
    }
    m_exitCode = decoded(status);
}

}  // namespace vexa::client
