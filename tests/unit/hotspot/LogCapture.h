#pragma once

#include <filesystem>
#include <string>
#include <vector>

namespace vexa::test {

/// Switches the diagnostic log on for its lifetime, into a file of its own.
class LogCapture {
public:
    LogCapture();
    ~LogCapture();
    LogCapture(const LogCapture&) = delete;
    LogCapture& operator=(const LogCapture&) = delete;

    /// The messages since the last call, each without its number, time and line feed.
    std::vector<std::string> lines();

    /// The same as one text, a line each.
    std::string text();

private:
    std::filesystem::path m_folder;
};

}  // namespace vexa::test
