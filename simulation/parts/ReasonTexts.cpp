#include "simulation/parts/ReasonTexts.h"

#include <utility>

namespace vexa::simulation {

namespace {

constexpr std::pair<DWORD, std::u16string_view> kReasonTexts[] = {
    {kSucceeded, u"The operation was successful."},
    {kUserDisconnected, u"The user disconnected."},
    {kConnectionLost, u"The connection was lost."},
    {kNotAvailable, u"The network is not available."},
    {kCancelled, u"The connection was cancelled."},
    {kRefused, u"The user name or password is not correct, or the certificate was refused."},
};

}  // namespace

std::u16string_view reasonText(DWORD reason) {
    for (const auto& [code, text] : kReasonTexts) {
        if (code == reason) return text;
    }
    return u"The reason is unknown.";
}

}  // namespace vexa::simulation
