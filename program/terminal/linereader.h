#pragma once

#include <functional>
#include <string>
#include <utility>

namespace velmora::cli {

// Lines of standard input, without losing Ctrl-C while waiting for one.
class LineReader
{
public:
    // check is called some times a second while there is no line; it throws what ends the waiting.
    explicit LineReader(std::function<void()> check) : m_check(std::move(check)) {}

    // False at the end of the input. Throws what check does.
    bool read(std::string& line);

private:
    bool fill();

    std::function<void()> const m_check;
    std::string m_buffer;
};

// Forgets what was typed so far. Before a question: nobody answers one that was not to be seen yet.
void dropTypedAhead();

} // namespace velmora::cli
