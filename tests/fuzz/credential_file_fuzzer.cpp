// Any bytes as a file of credentials. What is read of it can be stored, and written and read again is the
// same.

#include "client/import/CredentialFile.h"
#include "client/import/OwnFormat.h"
#include "client/terminal/ClientError.h"
#include "fuzz/FuzzMachine.h"

namespace vexa::test {
namespace {

using namespace client;

CredentialList listOf(const CredentialFile& file) {
    CredentialList list;
    for (const FiledCredential& filed : file.credentials) {
        require(!objectionTo(filed.credential), "what is read can be stored");
        list.push_back(filed.credential);
    }
    return list;
}

void readAndWrite(const std::string& text) try {
    const CredentialList list = listOf(readCredentialFile(text));
    require(listOf(readOwnFormat(ownFormat(list, Passwords::Shown))) == list,
            "what is written reads the same");
} catch (const ClientError&) {  // refused
}

}  // namespace
}  // namespace vexa::test

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    vexa::test::readAndWrite(std::string(vexa::test::textOf(data, size)));
    return 0;
}
