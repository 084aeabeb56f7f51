#pragma once

#include <algorithm>
#include <cstddef>
#include <initializer_list>
#include <memory>
#include <span>
#include <utility>
#include <vector>

#include "hotspot/NaiRealmParser.h"

namespace vexa {

/// The realms of a network. They are never changed in place: copies share them, however many there are.
class RealmList {
public:
    RealmList() = default;
    RealmList(std::vector<RealmInfo> realms) {
        if (!realms.empty()) m_realms = std::make_shared<const std::vector<RealmInfo>>(std::move(realms));
    }
    RealmList(std::initializer_list<RealmInfo> realms) : RealmList(std::vector<RealmInfo>(realms)) {}

    auto begin() const { return all().begin(); }
    auto end() const { return all().end(); }
    std::size_t size() const { return all().size(); }
    bool empty() const { return m_realms == nullptr; }

    friend bool operator==(const RealmList& a, const RealmList& b) {
        return a.m_realms == b.m_realms || std::equal(a.begin(), a.end(), b.begin(), b.end());
    }

private:
    std::span<const RealmInfo> all() const {
        return empty() ? std::span<const RealmInfo>() : std::span(*m_realms);
    }

    std::shared_ptr<const std::vector<RealmInfo>> m_realms;
};

}  // namespace vexa
