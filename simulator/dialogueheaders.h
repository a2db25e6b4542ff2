#pragma once

#include "simulator/dialogue.h"

namespace obdsim {

struct HeadersName
{
    DialogueHeaders value;
    char const* name;
};

/// How a dialogue file writes them.
inline constexpr HeadersName headersNames[] = {
    {DialogueHeaders::Off, "off"}, {DialogueHeaders::On, "on"}, {DialogueHeaders::Late, "late"}};

} // namespace obdsim
