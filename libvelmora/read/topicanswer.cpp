#include "libvelmora/read/topicanswer.h"

#include <obd/nack.h>

#include <fmt/format.h>

namespace velmora {

TopicAnswer toAnswer(obd::Verdict const& verdict)
{
    switch (verdict.kind) {
    case obd::OutcomeKind::Answered:
    case obd::OutcomeKind::NothingStored:
        return TopicAnswer::Read;
    case obd::OutcomeKind::Refused:
        return TopicAnswer::Refused;
    case obd::OutcomeKind::Unreadable:
        return TopicAnswer::Unreadable;
    case obd::OutcomeKind::NotOffered:
        return TopicAnswer::NotOffered;
    case obd::OutcomeKind::ModuleSilent:
    case obd::OutcomeKind::NotConnected:
        return TopicAnswer::Silent;
    }
    return TopicAnswer::Silent;
}

std::string refusalText(int code)
{
    if (code == obd::NackAcknowledged) {
        return {};
    }
    std::string text = obd::NackToString(static_cast<obd::Nack>(code));
    if (text == "Unknown") {
        return fmt::format("response code {:02X}", code);
    }
    text.front() = static_cast<char>(text.front() - 'A' + 'a');
    return fmt::format("{} ({:02X})", text, code);
}

} // namespace velmora
