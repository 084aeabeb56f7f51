#include "fuzz/FuzzMachine.h"

#include <cstdlib>
#include <fstream>
#include <iostream>
#include <iterator>

#include "simulation/scenario/Scenario.h"

namespace vexa::test {

namespace fs = std::filesystem;

namespace {

fs::path temporaryFolder() {
    std::string pattern = (fs::temp_directory_path() / "vexa-fuzz-XXXXXX").string();
    require(mkdtemp(pattern.data()) != nullptr, "a temporary folder");
    return pattern;
}

}  // namespace

FuzzMachine::FuzzMachine()
    : m_folder(temporaryFolder()), m_machine(simulation::parseScenario("{}"), m_folder) {
    fs::create_directories(store() / "Dump");
}

FuzzMachine::~FuzzMachine() {
    m_machine.stop();
    std::error_code ignored;
    fs::remove_all(m_folder, ignored);
}

void FuzzMachine::write(const std::string& name, std::string_view content) const {
    std::ofstream(store() / name, std::ios::binary | std::ios::trunc) << content;
}

std::string FuzzMachine::read(const std::string& name) const {
    std::ifstream file(store() / name, std::ios::binary);
    return {std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()};
}

void require(bool isTrue, const char* what) {
    if (isTrue) return;
    std::cerr << "Not so: " << what << std::endl;
    std::abort();
}

std::string_view textOf(const std::uint8_t* data, std::size_t size) {
    return {reinterpret_cast<const char*>(data), size};
}

}  // namespace vexa::test
