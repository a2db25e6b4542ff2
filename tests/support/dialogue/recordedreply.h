#pragma once

#include "tests/support/dialogue/recordeddialogue.h"

#include <obd/obdprotocol.h>
#include <obd/responsemap.h>

#include <string>
#include <vector>

// Recorded replies on the way that they take in the driver.
namespace support {

// One line that was sent, and what came back.
struct Question
{
    std::string request;
    int occurrence; // of this text in the dialogue, counted from 1
    std::string reply;
    bool headers; // whether the reply was printed with them
};

std::vector<Question> questionsOf(RecordedDialogue const& dialogue);

obd::ObdProtocol familyOf(RecordedDialogue const& dialogue);

// Without its blanks, in capitals.
std::string compacted(std::string const& text);

// What a request's caller gets out of a reply that was printed with headers. The read ends at the first prompt, without
// one there is no reply.
obd::ResponseMap payloadsOf(obd::ObdProtocol family, std::string const& reply);

// A reply on CAN that was printed without headers, as the adapter prints it with them: the length line and the numbers
// of the lines are the protocol bytes that it left out. Each message is given to a module of its own, in their order,
// and blanks are left out. Lines that are no message stay as they are.
std::string withHeaders(obd::ObdProtocol family, std::string const& reply);

} // namespace support
