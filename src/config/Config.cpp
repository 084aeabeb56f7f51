#include "config/Config.h"

#include <algorithm>
#include <new>
#include <string_view>
#include <tuple>
#include <utility>

#include "base/DiagnosticLog.h"
#include "config/SafeSave.h"
#include "contract/Registry.h"
#include "contract/Store.h"
#include "platform/Account.h"
#include "platform/Files.h"
#include "platform/KnownFolders.h"
#include "platform/Registry.h"
#include "text/ScopeGuard.h"
#include "text/TextConversion.h"

namespace vexa {

namespace {

constexpr std::size_t kMaxPath = 259;
constexpr std::size_t kMaxDumpPath = 254;
constexpr std::size_t kLongestEnd = std::string_view("__99.txt").size();
constexpr int kDumpNumbers = 100;
constexpr std::size_t kMaxRegistryBytes = 260;

constexpr const wchar_t* kDefaultDumpName = L"hs20log.txt";

// A name by itself: no way to another folder or stream, and so short that the path keeps its end.
bool isFitDumpName(std::wstring_view name, std::size_t room) {
    return name.find(L"..") == std::wstring_view::npos &&
           name.find_first_of(L"\\/:*?\"<>|") == std::wstring_view::npos &&
           cutToUtf16Units(name, room) == name;
}

std::wstring path(const std::wstring& folder, const char* name) {
    return cutToUtf16Units(folder + L"\\" + wideFromNarrow(name), kMaxPath);
}

}  // namespace

ResultCode Config::initPaths() {
    const auto user = platform::accountName();
    if (!user) return kFailure;
    m_userName = *user;
    const auto publicFolder = platform::publicFolder();
    if (!publicFolder) return kFailure;
    const std::wstring roaming = path(*publicFolder, contract::kRoamingFolder);
    const std::wstring base = path(roaming, contract::kMakerFolder);
    for (const std::wstring& folder : {roaming, base, path(base, contract::kDumpFolder)})
        if (!platform::createFolder(folder)) return kFailure;
    const std::wstring file = path(base, contract::kConfigFile);
    if (!platform::canOpenFile(file)) createDefaultFile(file);
    m_baseDir = base;
    m_configPath = file;
    return kSuccess;
}

// A file that is there and could not be opened is left alone.
ResultCode Config::createDefaultFile(const std::wstring& path) {
    if (!platform::createFolder(path.substr(0, path.rfind(L'\\')))) return kFailure;
    return saveSafely(path, contract::kDefaultDocument, platform::Existing::Keep) ? kSuccess : kFailure;
}

// Nothing: it can't be opened, or not be read.
std::optional<StoredContent> Config::readFile(ResultCode& result) const {
    result = platform::canOpenFile(m_configPath) ? kSuccess : kNotFound;
    if (result != kSuccess) return std::nullopt;
    StoredContent content(m_content);
    if (platform::readFile(m_configPath, [&](std::string_view piece) { content.take(piece); }))
        return content;
    result = kFailure;
    return std::nullopt;
}

ResultCode Config::openDocument(const std::string& content) {
    m_xmlDoc.create();
    return m_xmlDoc.parse(content) == kSuccess ? kSuccess : kFailure;
}

ResultCode Config::readConfig(bool* configChanged) {
    if (configChanged != nullptr) *configChanged = false;
    const ScopeGuard release([this]() NO_THREAD_SAFETY_ANALYSIS { m_xmlDoc.release(); });
    m_content.clear();
    m_frame.reset();
    ResultCode result = kFailure;
    const auto stored = readFile(result);
    if (!stored) return result;
    std::string content = stored->text();
    if (openDocument(content) != kSuccess) return kFailure;
    readGlobalSettings();
    bool isChanged = false;
    Reading reading{.table = m_credentials, .trace = Trace::Yes};
    if (readTable(reading, isChanged) != kSuccess) return kFailure;
    remember(reading.inFile, reading.hasUser);
    m_content = std::move(content);
    m_bUnsaved = false;
    if (configChanged != nullptr) *configChanged = isChanged;
    return kSuccess;
}

// A table that was read in part would take the rest out of the file when it is saved.
ResultCode Config::readTable(Reading& reading, bool& isChanged) {
    CredentialTable before = std::exchange(m_credentials, {});
    try {
        const bool isRead =
            readCredentials(reading, isChanged) == kSuccess && readUsers(reading, isChanged) == kSuccess;
        return isRead ? kSuccess : kFailure;
    } catch (const std::bad_alloc&) {
        m_credentials = std::move(before);
        throw;
    }
}

bool Config::readFlag(const char* xpath, bool missing) {
    const auto text = m_xmlDoc.getText(xpath, Node());
    return text ? *text == L"true" : missing;
}

std::int32_t Config::readNumber(const char* xpath) {
    return leadingInteger(m_xmlDoc.getText(xpath, Node()).value_or(L""));
}

std::wstring Config::textOf(Node node, const char* child, const wchar_t* missing) {
    return m_xmlDoc.getText(child, node).value_or(missing);
}

// An empty number counts as a missing one.
std::int32_t Config::numberOf(Node node, const char* child) {
    const std::wstring text = textOf(node, child, L"");
    return text.empty() ? -1 : leadingInteger(text);
}

void Config::readGlobalSettings() {
    m_dumpFilePath = m_xmlDoc.getText("/*/global/dump_file_path", Node()).value_or(L"");
    if (m_dumpFilePath.empty()) m_dumpFilePath = kDefaultDumpName;
    m_bCreateNewDumpFile = readFlag("/*/global/create_new_dump_file", false);
    deriveDumpFilePath();
    m_bAutoConnect = readFlag("/*/global/autoconnect", true);
    m_bEnableDump = readFlag("/*/global/enabledump", false);
    DiagnosticLog::setEnableDump(m_bEnableDump);
    if (m_bEnableDump) m_dumpLevel = readNumber("/*/global/dumplevel");
    m_homeRealm = m_xmlDoc.getText("/*/global/homerealm", Node()).value_or(L"");
    readAutoConnectFromRegistry();
}

// Whoever may edit the file must not choose which file this process appends to.
void Config::deriveDumpFilePath() {
    const std::wstring user = m_userName.empty() ? L"all" : m_userName.substr(m_userName.rfind(L'\\') + 1);
    const std::wstring folder = m_baseDir + L"\\Dump\\";
    const std::size_t room = kMaxDumpPath - std::min(kMaxDumpPath, folder.size() + user.size() + kLongestEnd);
    if (!isFitDumpName(m_dumpFilePath, room)) m_dumpFilePath = kDefaultDumpName;
    if (!m_bCreateNewDumpFile) {
        m_dumpFilePath = cutToUtf16Units(folder + m_dumpFilePath + L"_" + user + L".txt", kMaxDumpPath);
        return;
    }
    std::wstring name = m_dumpFilePath;
    name.resize(std::min(name.find(L".txt"), name.size()));
    const std::wstring beginning = folder + name + L"_" + user + L"_";
    for (int number = 0; number < kDumpNumbers; ++number) {
        std::wstring whole = beginning;
        whole.append(std::to_wstring(number)).append(L".txt");
        const std::wstring candidate = cutToUtf16Units(whole, kMaxDumpPath);
        if (platform::canOpenFile(candidate)) continue;
        m_dumpFilePath = candidate;
        return;
    }
}

void Config::readAutoConnectFromRegistry() {
    const auto key = platform::RegistryKey::open(platform::RegistryRoot::CurrentUser, contract::kProductKey);
    const auto text = key ? key->wideValue(contract::kHotspotSwitchValue, kMaxRegistryBytes) : std::nullopt;
    m_bHotSpotAutoConnect = !text || compareNoCase(*text, L"false") != 0;
}

}  // namespace vexa
