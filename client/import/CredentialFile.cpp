#include "client/import/CredentialFile.h"

#include <filesystem>
#include <fstream>

#include "client/import/EapMetadata.h"
#include "client/import/OwnFormat.h"
#include "client/terminal/ClientError.h"
#include "client/terminal/Text.h"

namespace vexa::client {

namespace {

constexpr std::size_t kLimit = std::size_t{1} << 20;

char firstCharacter(const std::string& text) {
    const std::size_t first = text.find_first_not_of(" \t\r\n\xEF\xBB\xBF");
    return first == std::string::npos ? '\0' : text[first];
}

}  // namespace

CredentialFile readCredentialFile(const std::string& text) {
    if (text.size() > kLimit) throw ClientError("the file is longer than 1 MiB");
    switch (firstCharacter(text)) {
        case '<':
            return readEapMetadata(text);
        case '{':
            return readOwnFormat(text);
        default:
            throw ClientError("the file is neither EAP metadata nor what `vexa credential export` writes");
    }
}

std::string textOfFile(const std::string& path) {
    std::error_code error;
    std::ifstream file;
    if (!std::filesystem::is_directory(path, error)) file.open(std::filesystem::path(path), std::ios::binary);
    if (!file.is_open()) throw ClientError("the file " + inQuotes(path) + " cannot be read");
    std::string text(kLimit + 1, '\0');
    file.read(text.data(), static_cast<std::streamsize>(text.size()));
    text.resize(static_cast<std::size_t>(file.gcount()));
    if (file.bad()) throw ClientError("the file " + inQuotes(path) + " cannot be read");
    return text;
}

}  // namespace vexa::client
