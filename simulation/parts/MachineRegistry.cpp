#include "simulation/parts/MachineRegistry.h"

#include <algorithm>
#include <cstdio>

#include "contract/Registry.h"
#include "platform/posix/OwnerFiles.h"
#include "simulation/scenario/JsonText.h"
#include "simulation/text/Text.h"
#include "simulation/text/Wire.h"
#include "text/TextConversion.h"

namespace vexa::simulation {

using platform::LockGuard;
using platform::Mutex;
using platform::RegistryRoot;

namespace {

std::string classKeyPath() {
    return std::string("HKEY_LOCAL_MACHINE\\") + contract::kNetworkAdapterClassKey;
}

Json::Value localMachine(const std::vector<ClassKeyEntry>& classKey) {
    Json::Value keys(Json::objectValue);
    keys[classKeyPath()] = Json::Value(Json::objectValue);
    for (std::size_t i = 0; i < classKey.size(); ++i) {
        char number[16];
        std::snprintf(number, sizeof number, "%04u", static_cast<unsigned>(i));
        Json::Value& values = keys[classKeyPath() + "\\" + number];
        values = Json::Value(Json::objectValue);
        if (classKey[i].netCfgInstanceId) values["NetCfgInstanceId"] = *classKey[i].netCfgInstanceId;
        if (classKey[i].matchingDeviceId) values["MatchingDeviceId"] = *classKey[i].matchingDeviceId;
    }
    return keys;
}

std::string fullPath(RegistryRoot root, const std::string& path) {
    const char* name = root == RegistryRoot::LocalMachine ? "HKEY_LOCAL_MACHINE" : "HKEY_CURRENT_USER";
    return path.empty() ? name : std::string(name) + "\\" + path;
}

// What is there keeps its spelling: another case names the same.
Json::Value& memberNoCase(Json::Value& object, const std::string& name) {
    for (const std::string& present : object.getMemberNames()) {
        if (compareNoCase(present, name) == 0) return object[present];
    }
    return object[name];
}

Json::Value& valuesOf(Json::Value& keys, const std::string& path) {
    Json::Value& values = memberNoCase(keys, path);
    if (!values.isObject()) values = Json::Value(Json::objectValue);
    return values;
}

bool liesBelow(const std::string& key, const std::string& path) {
    return key.size() > path.size() && startsWithNoCase(key, path) && key[path.size()] == '\\';
}

// The value as it stands in memory: text in the machine's code page, a number as a DWORD.
std::string rawValue(const Json::Value& value) {
    if (value.isString()) return latin1(value.asString());
    std::uint8_t number[4] = {};
    if (value.isUInt()) storeU32(number, 0, value.asUInt());
    return {std::begin(number), std::end(number)};
}

}  // namespace

MachineRegistry::MachineRegistry(const std::vector<ClassKeyEntry>& classKey, std::filesystem::path file)
    : m_localMachine(localMachine(classKey)), m_file(std::move(file)) {}

bool MachineRegistry::hasKey(RegistryRoot root, const std::string& path) const {
    const LockGuard<Mutex> lock(m_mutex);
    const std::string wanted = fullPath(root, path);
    const auto keys = keysOf(root).getMemberNames();
    return std::any_of(keys.begin(), keys.end(), [&](const std::string& key) {
        return compareNoCase(key, wanted) == 0 || liesBelow(key, wanted);
    });
}

std::vector<std::string> MachineRegistry::subkeys(RegistryRoot root, const std::string& path) const {
    const LockGuard<Mutex> lock(m_mutex);
    const std::string parent = fullPath(root, path);
    std::vector<std::string> names;
    for (const std::string& key : keysOf(root).getMemberNames()) {
        if (!liesBelow(key, parent)) continue;
        const std::string rest = key.substr(parent.size() + 1);
        const std::string name = rest.substr(0, rest.find('\\'));
        const auto same = [&](const std::string& other) { return compareNoCase(other, name) == 0; };
        if (std::none_of(names.begin(), names.end(), same)) names.push_back(name);
    }
    return names;
}

std::optional<std::string> MachineRegistry::value(RegistryRoot root, const std::string& path,
                                                  const std::string& name) const {
    const LockGuard<Mutex> lock(m_mutex);
    const Json::Value keys = keysOf(root);
    const std::string wanted = fullPath(root, path);
    for (const std::string& key : keys.getMemberNames()) {
        if (compareNoCase(key, wanted) != 0 || !keys[key].isObject()) continue;
        for (const std::string& member : keys[key].getMemberNames()) {
            if (compareNoCase(member, name) == 0) return rawValue(keys[key][member]);
        }
    }
    return std::nullopt;
}

bool MachineRegistry::setAutoConnect(const std::optional<std::string>& text) {
    const LockGuard<Mutex> lock(m_mutex);
    Json::Value keys = readContent();
    Json::Value& values = valuesOf(keys, contract::productKeyPath());
    for (const std::string& name : values.getMemberNames())
        if (compareNoCase(name, contract::kHotspotSwitchValue) == 0) values.removeMember(name);
    if (text) values[contract::kHotspotSwitchValue] = *text;
    return posix::replaceFile(m_file, indentedJson(keys));
}

bool MachineRegistry::setNumber(const std::string& path, const std::string& name, std::uint32_t number) {
    const LockGuard<Mutex> lock(m_mutex);
    Json::Value keys = readContent();
    memberNoCase(valuesOf(keys, fullPath(RegistryRoot::CurrentUser, path)), name) = number;
    return posix::replaceFile(m_file, indentedJson(keys));
}

Json::Value MachineRegistry::content() const {
    const LockGuard<Mutex> lock(m_mutex);
    return readContent();
}

Json::Value MachineRegistry::keysOf(RegistryRoot root) const {
    return root == RegistryRoot::LocalMachine ? m_localMachine : readContent();
}

// Read anew each time: another process of the same machine may have written it.
Json::Value MachineRegistry::readContent() const {
    const auto text = posix::readFile(m_file);
    std::string error;
    const auto content = text ? parseJson(*text, error) : std::nullopt;
    return content && content->isObject() ? *content : Json::Value(Json::objectValue);
}

}  // namespace vexa::simulation
