#include "client/output/Silence.h"

#include <CLI/CLI.hpp>
#include <iostream>
#include <streambuf>

namespace vexa::client {

namespace {

class Nowhere : public std::streambuf {
protected:
    int_type overflow(int_type character) override { return traits_type::not_eof(character); }
    std::streamsize xsputn(const char*, std::streamsize count) override { return count; }
};

}  // namespace

Silence::Silence()
    : m_nowhere(std::make_unique<Nowhere>()), m_output(std::cout.rdbuf()), m_errors(std::cerr.rdbuf()) {}

Silence::~Silence() {
    std::cout.rdbuf(m_output);
    std::cerr.rdbuf(m_errors);
}

void Silence::addTo(CLI::App& app) {
    for (CLI::App* command : app.get_subcommands([](const CLI::App*) { return true; })) {
        const bool hasOwn = command->get_option_no_throw("-q") != nullptr;
        if (!command->get_subcommands([](const CLI::App*) { return true; }).empty())
            addTo(*command);
        else if (!command->get_group().empty() && !hasOwn)
            command->add_flag_callback(
                "-q,--quiet", [this] { begin(); }, "Say nothing: the exit code alone tells");
    }
}

void Silence::begin() {
    std::cout.rdbuf(m_nowhere.get());
    std::cerr.rdbuf(m_nowhere.get());
}

}  // namespace vexa::client
