#pragma once

#include <string>

namespace velmora {

// What a negative response code (ISO 14229-1, ISO 14230-3) means for asking again.
enum class RefusalAction
{
    StopAbsent,     // the module has it not
    StopLocked,     // it is there, but locked
    StopSession,    // it is there, in another session only
    RetryLater,     // conditions such as ignition and speed will change
    RetrySoon,      // busy
    Wait,           // the answer is to come
    Split,          // too long an answer: ask for less at once
    StopAfterThree, // nothing that the standards settle
};

RefusalAction refusalAction(unsigned char code);

// "Request Out of Range"; "code 3B" for one without a name.
std::string refusalName(unsigned char code);

} // namespace velmora
