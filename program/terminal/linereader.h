#pragma once

#include <string>

namespace velmora {
class Session;
}

namespace velmora::cli {

// Lines of standard input, without losing Ctrl-C while waiting for one.
class LineReader
{
public:
    explicit LineReader(Session const& session) : m_session(session) {}

    // False at the end of the input. Throws Error if the link breaks or the user interrupts meanwhile.
    bool read(std::string& line);

private:
    bool fill();

    Session const& m_session;
    std::string m_buffer;
};

// Forgets what was typed so far. Before a question: nobody answers one that was not to be seen yet.
void dropTypedAhead();

} // namespace velmora::cli
