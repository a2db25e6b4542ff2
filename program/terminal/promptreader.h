#pragma once

#include "program/terminal/keyinput.h"
#include "program/terminal/lineeditor.h"

#include <functional>
#include <string>

namespace velmora::cli {

// Lines that a user types at a prompt on standard error, with the lines before them behind the arrow keys. However the
// program ends short of being killed, the terminal is as before.
class PromptReader
{
public:
    // Whether both ends are a terminal that the cursor can be moved on.
    static bool isUsable();

    // Whether standard error is such a terminal.
    static bool canRedraw();

    // check is called some times a second while nothing is typed; it throws what ends the waiting.
    explicit PromptReader(std::function<void()> check);
    ~PromptReader();
    PromptReader(PromptReader const&) = delete;
    PromptReader& operator=(PromptReader const&) = delete;

    // False if the user ends the input. Throws what check does.
    bool read(std::string& line);

private:
    LineEditor::State typeOn();
    void draw() const;

    std::function<void()> const m_check;
    KeyInput m_keys;
    LineEditor m_editor;
};

} // namespace velmora::cli
