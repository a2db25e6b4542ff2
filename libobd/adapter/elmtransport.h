#pragma once

#include <obd/idataconnection.h>

#include <memory>
#include <vector>

namespace obd {

// Ends a reply of the adapter; it is then ready for the next command.
inline constexpr char elmPrompt = '>';
// Ends a command to the adapter, and each line of its replies.
inline constexpr char elmLineEnd = '\r';

enum class TransportStatus : int
{
    Ok = 0,
    Timeout = 1, // nothing usable came in time; on sending: the connection is dead, or as good as that
    Failure = 2, // the connection is dead, or a read that was given no time found nothing
};

// Sends one line: the payload and a CR. Drops first whatever the adapter has said since the last exchange, so that no
// reply is taken for the answer to the wrong command. Its only failure is Timeout, for a dead connection and for one
// that brings more unasked replies than an adapter can have given; nothing is sent then.
TransportStatus elmTransportSend(std::shared_ptr<IDataConnection>& connection,
                                 std::vector<unsigned char> const& payload);

// Takes out of a reply what is no part of its text: NULs, line ends, prompts and "?". Its lines become one run.
void cleanReply(std::vector<unsigned char>& data);

// Waits for one reply and leaves it in data, cleaned. A reply of which nothing is left reads as Timeout, at once. A
// connection that dies ends the wait within 250 ms. wasQuestion, if given, tells whether the reply was the adapter's
// "?" and nothing else.
TransportStatus elmTransportReceive(std::shared_ptr<IDataConnection>& connection, std::vector<unsigned char>& data,
                                    unsigned int timeoutMs, bool* wasQuestion = nullptr);

} // namespace obd
