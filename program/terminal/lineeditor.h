#pragma once

#include "program/terminal/keyinput.h"

#include <cstddef>
#include <string>
#include <vector>

namespace velmora::cli {

// A line while it is typed, with the lines before it behind the arrow keys. Knows no screen.
class LineEditor
{
public:
    enum class State : int
    {
        Typing,
        Entered, // take the line
        Ended,   // Ctrl-D on an empty line
    };

    State press(Key key);

    std::string const& text() const { return m_text; }
    std::size_t cursor() const { return m_cursor; }

    // The entered line; the next one begins empty.
    std::string take();

private:
    State control(char character);
    void insert(char character);
    void erase(std::size_t at);
    void recall(std::size_t entry);

    std::string m_text;
    std::size_t m_cursor = 0;
    std::vector<std::string> m_history;
    std::size_t m_entry = 0; // of the history, shown; its size for the new line
    std::string m_draft;     // the new line, while an old one is shown
};

} // namespace velmora::cli
