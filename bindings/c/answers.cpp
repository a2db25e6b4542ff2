#include "bindings/c/telltopic.h"

namespace velmora::cface {

std::uint32_t numberOf(TopicAnswer answer)
{
    return static_cast<std::uint32_t>(answer);
}

std::uint32_t numberOf(CodeList const& list)
{
    switch (list.answer) {
    case CodeList::Answer::Read:
        return VELMORA_ANSWER_READ;
    case CodeList::Answer::Refused:
        return list.offered ? VELMORA_ANSWER_REFUSED : VELMORA_ANSWER_NOT_OFFERED;
    case CodeList::Answer::Silent:
        return VELMORA_ANSWER_SILENT;
    case CodeList::Answer::Unreadable:
        return VELMORA_ANSWER_UNREADABLE;
    }
    return VELMORA_ANSWER_UNREADABLE;
}

std::uint32_t numberOf(std::optional<bool> told)
{
    return !told ? VELMORA_UNTOLD : *told ? VELMORA_YES : VELMORA_NO;
}

std::uint32_t numberOf(ReadinessStatus status)
{
    switch (status) {
    case ReadinessStatus::Complete:
        return VELMORA_MONITOR_COMPLETE;
    case ReadinessStatus::NotComplete:
        return VELMORA_MONITOR_NOT_COMPLETE;
    case ReadinessStatus::DisabledThisCycle:
        return VELMORA_MONITOR_DISABLED;
    case ReadinessStatus::NotAvailable:
        return VELMORA_MONITOR_NOT_AVAILABLE;
    }
    return VELMORA_MONITOR_UNTOLD;
}

} // namespace velmora::cface
