#pragma once

#include <cstdint>
#include <filesystem>
#include <string>
#include <string_view>

#include "simulation/Machine.h"

namespace vexa::test {

/// The machine of one fuzzer, in a temporary folder that goes with it.
class FuzzMachine {
public:
    FuzzMachine();
    ~FuzzMachine();
    FuzzMachine(const FuzzMachine&) = delete;
    FuzzMachine& operator=(const FuzzMachine&) = delete;

    /// A file of the store.
    void write(const std::string& name, std::string_view content) const;
    std::string read(const std::string& name) const;

private:
    std::filesystem::path store() const { return m_folder / "Public" / "Roaming" / "Korvane"; }

    std::filesystem::path m_folder;
    simulation::Machine m_machine;
};

/// What a fuzzer holds to be true always: ends the process if it isn't.
void require(bool isTrue, const char* what);

std::string_view textOf(const std::uint8_t* data, std::size_t size);

}  // namespace vexa::test
