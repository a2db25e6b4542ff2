#pragma once

#include <optional>
#include <string>
#include <termios.h>

namespace velmora {

enum class Key : int
{
    Up = 256,
    Down = 257,
    PageUp = 258,
    PageDown = 259,
    Escape = 27,
    Enter = '\n',
    Space = ' ',
};

// Takes the keys out of what a terminal sent, in its order; a letter is its own code. Sequences that are not known
// give nothing.
std::optional<Key> takeKey(std::string& bytes);

// The screen of a terminal for as long as the object lives: keys come singly and are not shown, frames replace each
// other on a page of their own. However the program ends short of being killed, the terminal is as before. Ctrl-C goes
// on to interrupt; Ctrl-Z does nothing.
class Terminal
{
public:
    struct Size
    {
        std::size_t columns;
        std::size_t rows;
    };

    // Whether standard output is a terminal that can be drawn on.
    static bool isUsable();

    Terminal();
    ~Terminal();
    Terminal(Terminal const&) = delete;
    Terminal& operator=(Terminal const&) = delete;

    Size size() const;
    // Shows lines from the top; none may be wider than the screen.
    void draw(std::string const& frame);
    // The next key that was pressed, if any.
    std::optional<Key> readKey();

private:
    void enter();
    void leave();

    termios m_before{};
    bool const m_hasKeys; // standard input is a terminal too; behind m_before, which its question fills
    std::string m_input;
    bool m_inside = false;
};

} // namespace velmora
