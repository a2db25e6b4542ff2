#pragma once

#include "simulator/error.h"
#include "simulator/peer.h"

#include <vector>

namespace obdsim {

/// A dialogue file that cannot be used. what() begins with "FILE:LINE: ".
class DialogueError : public SimulatorError
{
public:
    using SimulatorError::SimulatorError;
};

/// Bytes that arrived together, and the pause before them.
struct DialogueChunk
{
    Time pause{};
    std::string bytes;
};

/// One line to the adapter, without its CR, and all that came back before the next.
struct Exchange
{
    std::string sent;
    std::vector<DialogueChunk> chunks;

    std::string received() const;
};

enum class DialogueHeaders : int
{
    Off,
    On,
    Late ///< switched on during the dialogue
};

/// A recorded conversation with an adapter.
struct Dialogue
{
    std::string vehicle;
    std::string adapter;
    int protocol = 0; ///< the adapter's number of the bus, 0 if unknown
    DialogueHeaders headers = DialogueHeaders::Off;
    bool raw = false; ///< replies are served byte for byte, faults and all
    std::vector<Exchange> exchanges;
};

/// Reads the text of a dialogue file; `origin` is its name in error messages.
Dialogue parseDialogue(std::string const& text, std::string const& origin);

/// Reads a file. Throws DialogueError if it cannot be read or is malformed.
Dialogue loadDialogue(std::string const& path);

/// The text that parseDialogue() reads back; `comment` lines stand on top.
std::string formatDialogue(Dialogue const& dialogue, std::vector<std::string> const& comment = {});

} // namespace obdsim
