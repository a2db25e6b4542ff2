#pragma once

#include <chrono>
#include <optional>
#include <string>
#include <termios.h>

namespace velmora::cli {

enum class Key : int
{
    Up = 256,
    Down,
    PageUp,
    PageDown,
    Left,
    Right,
    Home,
    End,
    Delete,
    Escape = 27,
    Enter = '\n',
    Space = ' ',
};

// Takes the keys out of what a terminal sent, in its order; a letter is its own code. Sequences that are not known
// give nothing.
std::optional<Key> takeKey(std::string& bytes);

// Whether the bytes begin with a sequence that has not come whole, as over a slow link; an Escape looks the same at
// first.
bool isUnfinished(std::string const& bytes);

// The keys of the terminal at standard input, singly and not shown, for as long as the object lives; none if it is no
// terminal. Ctrl-C goes on to interrupt; Ctrl-Z does nothing.
class KeyInput
{
public:
    KeyInput();
    ~KeyInput();
    KeyInput(KeyInput const&) = delete;
    KeyInput& operator=(KeyInput const&) = delete;

    // The next key that was or is pressed within the limit, if any. A sequence that comes in pieces is one key.
    std::optional<Key> read(std::chrono::milliseconds limit);
    // Whether the terminal has gone.
    bool ended() const { return m_ended; }
    // Leaves the terminal as it was before, as the destructor does.
    void restore() const;
    // The state from before; null if standard input is no terminal.
    termios const* before() const { return m_active ? &m_before : nullptr; }

private:
    using Clock = std::chrono::steady_clock;

    void take(std::chrono::milliseconds limit);

    termios m_before{};
    bool const m_active; // behind m_before, which its question fills
    bool m_ended = false;
    std::string m_bytes;
    Clock::time_point m_lastByte;
};

} // namespace velmora::cli
