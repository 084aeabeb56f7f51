#pragma once

#include <iosfwd>
#include <memory>

namespace CLI {
class App;
}

namespace vexa::client {

/// Takes in what a command prints where the user wants nothing but the exit code.
class Silence {
public:
    Silence();
    ~Silence();
    Silence(const Silence&) = delete;
    Silence& operator=(const Silence&) = delete;

    /// Adds the option for it to all commands of the program that are there.
    void addTo(CLI::App& app);

private:
    void begin();

    std::unique_ptr<std::streambuf> m_nowhere;
    std::streambuf* m_output;
    std::streambuf* m_errors;
};

}  // namespace vexa::client
