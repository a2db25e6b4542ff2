#include "libvelmora/port/serialprobe.h"

#include "common/text/text.h"

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <fcntl.h>
#include <poll.h>
#include <sys/file.h>
#include <sys/ioctl.h>
#include <termios.h>
#include <unistd.h>
#include <utility>

namespace velmora {

namespace {

using Clock = std::chrono::steady_clock;
using Outcome = SerialProbe::Outcome;

constexpr std::chrono::milliseconds answerLimit{700};
constexpr std::size_t longestAnswer = 4096;
constexpr std::string_view question = "ATI\r";

std::optional<speed_t> speedOf(unsigned int baud)
{
    constexpr std::pair<unsigned int, speed_t> speeds[] = {
        {9600, B9600},     {19200, B19200},   {38400, B38400},   {57600, B57600},
        {115200, B115200}, {230400, B230400}, {500000, B500000},
    };
    auto const* const found =
        std::find_if(std::begin(speeds), std::end(speeds), [baud](auto const& each) { return each.first == baud; });
    return found != std::end(speeds) ? std::optional(found->second) : std::nullopt;
}

// An open line that is left as it was found.
class BorrowedLine
{
public:
    explicit BorrowedLine(std::string const& device)
        : m_line(::open(device.c_str(), O_RDWR | O_NOCTTY | O_NONBLOCK | O_CLOEXEC)), m_error(errno)
    {
        m_isTerminal = m_line >= 0 && ::tcgetattr(m_line, &m_before) == 0;
    }
    ~BorrowedLine()
    {
        if (m_isTerminal) {
            ::tcsetattr(m_line, TCSANOW, &m_before);
        }
        if (m_isClaimed) {
            ::ioctl(m_line, TIOCNXCL);
        }
        if (m_line >= 0) {
            ::close(m_line);
        }
    }
    BorrowedLine(BorrowedLine const&) = delete;
    BorrowedLine& operator=(BorrowedLine const&) = delete;

    bool isOpen() const { return m_line >= 0; }
    int error() const { return m_error; }
    bool isTerminal() const { return m_isTerminal; }
    // False for a line that another program has taken for itself. The administrator may open such a one all the same.
    bool claim()
    {
        int isTaken = 0;
        bool const free = ::ioctl(m_line, TIOCGEXCL, &isTaken) != 0 || isTaken == 0;
        m_isClaimed = free && ::flock(m_line, LOCK_EX | LOCK_NB) == 0 && ::ioctl(m_line, TIOCEXCL) == 0;
        return m_isClaimed;
    }

    bool setRate(speed_t speed) const
    {
        termios settings = m_before;
        ::cfmakeraw(&settings);
        settings.c_cflag |= CLOCAL | CREAD;
        settings.c_cflag &= ~static_cast<tcflag_t>(CRTSCTS);
        ::cfsetspeed(&settings, speed);
        return ::tcsetattr(m_line, TCSANOW, &settings) == 0;
    }

    // What comes after the question, up to a prompt or the limit.
    std::string ask() const
    {
        ::tcflush(m_line, TCIFLUSH);
        if (::write(m_line, question.data(), question.size()) != static_cast<ssize_t>(question.size())) {
            return {};
        }
        std::string answer;
        Clock::time_point const end = Clock::now() + answerLimit;
        while (answer.size() < longestAnswer && answer.find('>') == std::string::npos) {
            auto const left = std::chrono::ceil<std::chrono::milliseconds>(end - Clock::now());
            pollfd state{m_line, POLLIN, 0};
            if (left.count() <= 0 || ::poll(&state, 1, static_cast<int>(left.count())) <= 0) {
                break;
            }
            char bytes[256];
            ssize_t const count = ::read(m_line, bytes, sizeof(bytes));
            if (count <= 0) {
                break;
            }
            answer.append(bytes, static_cast<std::size_t>(count));
        }
        return answer;
    }

private:
    int m_line;
    int m_error;
    bool m_isTerminal = false;
    bool m_isClaimed = false;
    termios m_before{};
};

// The readable part of an answer, without echo and prompt.
std::string cleaned(std::string answer)
{
    if (std::size_t const echo = answer.find("ATI\r"); echo != std::string::npos) {
        answer.erase(0, echo + question.size());
    }
    std::replace(answer.begin(), answer.end(), '>', ' ');
    return printableLine(answer);
}

// An adapter's prompt stands in a line of its own, alone; a console's stands behind a name.
bool hasPrompt(std::string const& answer)
{
    std::size_t const prompt = answer.find('>');
    std::string_view const before = std::string_view(answer).substr(0, prompt);
    bool const behindALine = before.ends_with('\r') || before.ends_with('\n') || before.ends_with('\0');
    return prompt != std::string::npos && behindALine;
}

// A prompt is what no modem and no printer sends. What stood in the adapter's line before makes the first question an
// unknown command, so that one is asked again.
SerialProbe askAt(BorrowedLine const& line, unsigned int baud)
{
    std::string answer = line.ask();
    if (hasPrompt(answer) && cleaned(answer).ends_with('?')) {
        answer = line.ask();
    }
    std::string const text = cleaned(answer);
    if (hasPrompt(answer) && !text.empty()) {
        return {Outcome::Adapter, baud, text};
    }
    return {text.empty() ? Outcome::Silent : Outcome::OtherThing, 0, text};
}

SerialProbe judgeOpening(BorrowedLine const& line)
{
    if (!line.isOpen()) {
        bool const held = line.error() == EBUSY;
        bool const forbidden = line.error() == EACCES || line.error() == EPERM;
        return {held ? Outcome::Held : forbidden ? Outcome::Forbidden : Outcome::Missing, 0, {}};
    }
    return {line.isTerminal() ? Outcome::Silent : Outcome::NoPort, 0, {}};
}

} // namespace

std::vector<unsigned int> const& usualRates()
{
    static std::vector<unsigned int> const rates{38400, 115200, 9600, 230400, 57600, 500000};
    return rates;
}

SerialProbe probeSerialPort(std::string const& device, std::vector<unsigned int> const& rates,
                            std::function<void(unsigned int baud)> const& trying, std::function<bool()> const& stop,
                            HolderPlaces const& places)
{
    // Asked before the line is opened: opening alone moves its control signals.
    if (std::optional<std::string> const holder = findPortHolder(device, places)) {
        return {Outcome::Held, 0, *holder};
    }
    BorrowedLine line(device);
    SerialProbe result = judgeOpening(line);
    if (result.outcome != Outcome::Silent) {
        return result;
    }
    if (!line.claim()) {
        return {Outcome::Held, 0, {}};
    }
    for (unsigned int const baud : rates) {
        std::optional<speed_t> const speed = speedOf(baud);
        if (!speed || (stop && stop())) {
            continue;
        }
        if (trying) {
            trying(baud);
        }
        SerialProbe const probe = line.setRate(*speed) ? askAt(line, baud) : SerialProbe{Outcome::Silent, 0, {}};
        if (probe.outcome == Outcome::Adapter) {
            return probe;
        }
        if (probe.outcome == Outcome::OtherThing) {
            result = probe;
        }
    }
    return result;
}

} // namespace velmora
