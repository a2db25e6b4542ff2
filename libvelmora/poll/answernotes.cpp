#include "libvelmora/poll/answernotes.h"

#include <algorithm>

namespace velmora {

std::optional<AnswerNotes::Time> AnswerNotes::last(unsigned int module, unsigned char pid) const
{
    auto const found = m_times.find({module, pid});
    return found != m_times.end() ? std::optional(found->second) : std::nullopt;
}

bool AnswerNotes::areFresh(unsigned int module, std::set<unsigned char> const& pids, Time now,
                           std::chrono::milliseconds oldest) const
{
    return std::all_of(pids.begin(), pids.end(), [&](unsigned char pid) {
        std::optional<Time> const time = last(module, pid);
        return time && now - *time <= oldest;
    });
}

} // namespace velmora
