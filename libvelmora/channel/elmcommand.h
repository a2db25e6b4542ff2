#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace velmora {

// One line to an adapter.
class ElmCommand
{
public:
    // Any case and blanks, with or without its CR.
    explicit ElmCommand(std::string_view line);

    // As the adapter understands it: upper case, no blanks, no CR.
    std::string const& text() const { return m_text; }

    // Bytes for the vehicle rather than a command for the adapter.
    bool isRequest() const { return !m_request.empty(); }
    // The bytes of a request.
    std::vector<std::uint8_t> const& bytes() const { return m_request; }
    unsigned int service() const { return m_request.empty() ? 0U : m_request.front(); }
    // A request that only reads: asking it twice does no harm.
    bool onlyReads() const;
    // A request of one fixed shape, whose reply has the same number of frames each time.
    bool hasFixedShape() const;
    // A question for the IDs that a module supports.
    bool asksForMask() const;

    bool startsWith(std::string_view word) const { return m_text.starts_with(word); }
    // A command that answers and changes nothing.
    bool onlyAsks() const;
    // A command after which the adapter starts anew.
    bool resets() const { return startsWith("ATZ") || startsWith("ATWS"); }
    // A command whose output ends only when the host interrupts it.
    bool monitors() const;
    // Which setting it changes, such as "ATST" of ATST64; nothing for commands that set nothing to be kept.
    std::optional<std::string> setting() const;

private:
    std::string m_text;
    std::vector<std::uint8_t> m_request;
};

// The value of a hexadecimal digit, or -1.
int hexDigitValue(char character);
// The bytes of hexadecimal digits; nothing where half a byte or anything else stands among them.
std::vector<std::uint8_t> digitBytes(std::string_view digits);
// Without white space, in upper case.
std::string compactText(std::string_view line);

} // namespace velmora
