#include "simulator/bytes.h"
#include "simulator/dialogue.h"
#include "simulator/dialogueheaders.h"
#include "simulator/textfile.h"

#include <sstream>
#include <utility>

namespace obdsim {

namespace {

constexpr long long longestPauseMs = 24LL * 3600 * 1000;

/// Reads a dialogue line by line.
class Reader
{
public:
    explicit Reader(std::string origin) : m_origin(std::move(origin)) {}

    Dialogue read(std::string const& text)
    {
        std::istringstream lines(text);
        std::string line;
        while (std::getline(lines, line)) {
            ++m_line;
            if (!line.empty() && line.back() == '\r') {
                line.pop_back();
            }
            readLine(line);
        }
        if (m_inHeader) {
            fail("the header has no end: a blank line and the dialogue are missing");
        }
        if (m_pause != Time(0)) {
            fail("no received line follows this pause");
        }
        return m_dialogue;
    }

private:
    void readLine(std::string const& line)
    {
        if (!line.empty() && line[0] == '#') {
            return;
        }
        if (line.empty()) {
            m_inHeader = m_inHeader && !m_hasHeader;
            return;
        }
        m_inHeader ? readHeader(line) : readTurn(line);
    }

    void readHeader(std::string const& line)
    {
        m_hasHeader = true;
        auto const colon = line.find(": ");
        if (colon == std::string::npos) {
            fail("a header line is \"name: value\"");
        }
        std::string const name = line.substr(0, colon);
        std::string const value = line.substr(colon + 2);
        if (name == "vehicle") {
            m_dialogue.vehicle = value;
        } else if (name == "adapter") {
            m_dialogue.adapter = value;
        } else if (name == "protocol") {
            m_dialogue.protocol = protocol(value);
        } else if (name == "headers") {
            m_dialogue.headers = headers(value);
        } else if (name == "raw") {
            m_dialogue.raw = yes(value);
        } else {
            fail("unknown header \"" + name + "\"");
        }
    }

    void readTurn(std::string const& line)
    {
        std::string const mark = line.substr(0, 2);
        std::string const rest = line.size() > 3 ? line.substr(3) : "";
        bool const spaced = line.size() <= 2 || line[2] == ' ';
        if (mark == "->" && spaced) {
            if (m_pause != Time(0)) {
                fail("no received line follows the pause before");
            }
            m_dialogue.exchanges.push_back({unescape(rest), {}});
        } else if (mark == "<-" && spaced) {
            addReceived(unescape(rest));
        } else if (mark == ".." && spaced) {
            m_pause += pause(rest);
        } else {
            fail("a line begins with \"-> \", \"<- \" or \".. \"");
        }
    }

    void addReceived(std::string const& bytes)
    {
        if (m_dialogue.exchanges.empty()) {
            fail("bytes are received before anything is sent");
        }
        auto& chunks = m_dialogue.exchanges.back().chunks;
        if (m_pause == Time(0) && !chunks.empty()) {
            chunks.back().bytes += bytes;
            return;
        }
        chunks.push_back({std::exchange(m_pause, Time(0)), bytes});
    }

    std::string unescape(std::string const& text) const
    {
        std::string bytes;
        for (std::size_t i = 0; i < text.size(); ++i) {
            bytes += text[i] == '\\' ? escaped(text, i) : text[i];
        }
        return bytes;
    }

    /// The character of the escape at `i`, which is moved to its last character.
    char escaped(std::string const& text, std::size_t& i) const
    {
        ++i;
        switch (i < text.size() ? text[i] : '\0') {
        case 'r':
            return '\r';
        case 'n':
            return '\n';
        case 't':
            return '\t';
        case '\\':
            return '\\';
        case 'x': {
            std::string const digits = text.substr(i + 1, 2);
            auto const value = digits.size() == 2 ? parseHexNumber(digits) : std::nullopt;
            if (value) {
                i += 2;
                return static_cast<char>(*value);
            }
            break;
        }
        default:
            break;
        }
        fail("wrong escape; there are \\r \\n \\t \\\\ and \\xNN");
    }

    int protocol(std::string const& value) const
    {
        if (value.size() != 1 || value[0] < '0' || value[0] > '9') {
            fail("the protocol is a number from 0 to 9");
        }
        return value[0] - '0';
    }

    DialogueHeaders headers(std::string const& value) const
    {
        for (auto const& row : headersNames) {
            if (value == row.name) {
                return row.value;
            }
        }
        fail("headers are \"on\", \"off\" or \"late\"");
    }

    bool yes(std::string const& value) const
    {
        if (value != "yes" && value != "no") {
            fail("raw is \"yes\" or \"no\"");
        }
        return value == "yes";
    }

    Time pause(std::string const& text) const
    {
        bool const digits =
            !text.empty() && text.size() < 10 && text.find_first_not_of("0123456789") == std::string::npos;
        if (!digits || std::stoll(text) > longestPauseMs) {
            fail("a pause is \".. \" and a number of milliseconds up to a day");
        }
        return Ms(std::stoll(text));
    }

    [[noreturn]] void fail(std::string const& what) const
    {
        throw DialogueError(m_origin + ":" + std::to_string(m_line) + ": " + what);
    }

    std::string m_origin;
    Dialogue m_dialogue;
    std::size_t m_line = 0;
    Time m_pause{};
    bool m_inHeader = true;
    bool m_hasHeader = false;
};

} // namespace

Dialogue parseDialogue(std::string const& text, std::string const& origin)
{
    return Reader(origin).read(text);
}

Dialogue loadDialogue(std::string const& path)
{
    auto const text = readTextFile(path, largestRecording);
    if (!text) {
        throw DialogueError(path + ": cannot be read: " + whyNoText(path, largestRecording));
    }
    return parseDialogue(*text, path);
}

} // namespace obdsim
