#include "program/terminal/keyinput.h"

#include <algorithm>
#include <iterator>
#include <poll.h>
#include <unistd.h>

namespace velmora::cli {

namespace {

struct Sequence
{
    char const* bytes;
    Key key;
};

constexpr Sequence sequences[] = {
    {"\033[A", Key::Up},      {"\033[B", Key::Down}, {"\033[C", Key::Right},   {"\033[D", Key::Left},
    {"\033OA", Key::Up},      {"\033OB", Key::Down}, {"\033OC", Key::Right},   {"\033OD", Key::Left},
    {"\033[H", Key::Home},    {"\033[F", Key::End},  {"\033OH", Key::Home},    {"\033OF", Key::End},
    {"\033[1~", Key::Home},   {"\033[4~", Key::End}, {"\033[5~", Key::PageUp}, {"\033[6~", Key::PageDown},
    {"\033[3~", Key::Delete},
};

constexpr std::chrono::milliseconds splitLimit{150};

// The length of a control sequence: it ends with the first letter or tilde behind its introducer.
std::size_t sequenceLength(std::string const& bytes)
{
    for (std::size_t i = 2; i < bytes.size(); ++i) {
        if (bytes[i] >= '@' && bytes[i] <= '~') {
            return i + 1;
        }
    }
    return bytes.size();
}

std::optional<Key> takeSequence(std::string& bytes)
{
    if (bytes.size() == 1 || (bytes[1] != '[' && bytes[1] != 'O')) {
        bytes.erase(0, 1);
        return Key::Escape;
    }
    std::string const sequence = bytes.substr(0, sequenceLength(bytes));
    bytes.erase(0, sequence.size());
    for (Sequence const& each : sequences) {
        if (sequence == each.bytes) {
            return each.key;
        }
    }
    return std::nullopt;
}

} // namespace

std::optional<Key> takeKey(std::string& bytes)
{
    while (!bytes.empty()) {
        if (bytes.front() != '\033') {
            char const byte = bytes.front();
            bytes.erase(0, 1);
            return byte == '\r' ? Key::Enter : static_cast<Key>(static_cast<unsigned char>(byte));
        }
        if (std::optional<Key> const key = takeSequence(bytes)) {
            return key;
        }
    }
    return std::nullopt;
}

bool isUnfinished(std::string const& bytes)
{
    if (bytes.empty() || bytes.front() != '\033') {
        return false;
    }
    bool const introduced = bytes.size() > 1 && (bytes[1] == '[' || bytes[1] == 'O');
    return bytes.size() == 1 ||
           (introduced && std::none_of(bytes.begin() + 2, bytes.end(), [](char c) { return c >= '@' && c <= '~'; }));
}

KeyInput::KeyInput() : m_active(::isatty(STDIN_FILENO) != 0 && ::tcgetattr(STDIN_FILENO, &m_before) == 0)
{
    if (!m_active) {
        return;
    }
    termios raw = m_before;
    raw.c_lflag &= ~static_cast<tcflag_t>(ICANON | ECHO);
    raw.c_cc[VMIN] = 0;
    raw.c_cc[VTIME] = 0;
    raw.c_cc[VSUSP] = _POSIX_VDISABLE;
    ::tcsetattr(STDIN_FILENO, TCSANOW, &raw);
}

KeyInput::~KeyInput()
{
    restore();
}

void KeyInput::restore() const
{
    if (m_active) {
        ::tcsetattr(STDIN_FILENO, TCSANOW, &m_before);
    }
}

void KeyInput::take(std::chrono::milliseconds limit)
{
    pollfd input[] = {{STDIN_FILENO, POLLIN, 0}};
    if (m_active && ::poll(input, std::size(input), static_cast<int>(limit.count())) > 0) {
        char bytes[64];
        ssize_t const count = ::read(STDIN_FILENO, bytes, sizeof bytes);
        m_ended = count <= 0;
        m_bytes.append(bytes, count > 0 ? static_cast<std::size_t>(count) : 0);
        m_lastByte = Clock::now();
    }
}

std::optional<Key> KeyInput::read(std::chrono::milliseconds limit)
{
    if (!isUnfinished(m_bytes)) {
        if (std::optional<Key> const key = takeKey(m_bytes)) {
            return key;
        }
    }
    take(isUnfinished(m_bytes) ? std::min(limit, splitLimit) : limit);
    bool const mayCome = isUnfinished(m_bytes) && Clock::now() - m_lastByte < splitLimit;
    return mayCome ? std::nullopt : takeKey(m_bytes);
}

} // namespace velmora::cli
