#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "platform/Mutex.h"
#include "simulation/text/Text.h"

namespace vexa::simulation {

/// After `skip` calls that match, the next `times` fail with `error`.
struct FailRule {
    std::string call;
    std::uint32_t error = 0;
    std::uint32_t times = 1;
    std::uint32_t skip = 0;
    std::optional<std::string> match;
};

/// The next `times` requests of this name succeed with these bytes.
struct ReplyRule {
    std::string match;
    Bytes data;
    std::uint32_t times = 1;
};

/// Faults that wait for their calls. Any thread.
class Faults {
public:
    void add(FailRule rule);
    void add(ReplyRule rule);

    /// The error that this call has to fail with, if any. `detail` is what a rule can narrow the call by: the
    /// name of the request, the number of the opcode, the name of the file. Counts the call.
    std::optional<std::uint32_t> nextError(std::string_view call, std::string_view detail = {});

    /// The bytes that this request has to be answered with, if any. Counts the request.
    std::optional<Bytes> nextReply(std::string_view request);

private:
    platform::Mutex m_mutex;
    std::vector<FailRule> m_failRules GUARDED_BY(m_mutex);
    std::vector<ReplyRule> m_replyRules GUARDED_BY(m_mutex);
};

}  // namespace vexa::simulation
