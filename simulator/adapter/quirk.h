#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace obdsim {

/// Habits of clones, seen on real ones, that a data sheet does not tell.
enum class Quirk : int
{
    PromptLate,           ///< the end of the reply to ATE0 comes with the next command
    PromptSlow,           ///< the prompt comes 250 ms behind its reply
    SingleReturn,         ///< one CR before the prompt, not two
    DoublePrompt,         ///< a second prompt behind the banner
    LinefeedsOn,          ///< ATL1 from the start
    JunkBeforeBanner,     ///< the byte FC, of the time when the line rate settles
    QuestionBeforeBanner, ///< a "?" line before the banner
    LeftoverQuestions,    ///< ten "?" with prompts after a reset
    StoppedFirst,         ///< the first command of a connection is answered STOPPED
    Greeting,             ///< the radio module speaks before the adapter does
    HeadersStuck,         ///< ATH0 is accepted, headers still shown
    EchoStuck,            ///< ATE0 is accepted, the echo stays on
    EchoKeptOff,          ///< ATD leaves the echo off
    PaddingShown,         ///< filling bytes of single frames are printed without headers, too
    FormattingStuck,      ///< ATCAF0 is accepted without effect
    OkToAll,              ///< any AT command is answered OK
    FirstLettersOnly,     ///< what follows a known command is ignored
    NoCountDigit,         ///< the expected-count digit is refused
    Pieces,               ///< replies come in pieces of a few bytes
    BytePerLine,          ///< a CR behind every byte of a frame
    SearchOk,             ///< a lone OK line behind SEARCHING...
    BusInitSplit,         ///< BUS INIT: OK without data; the next request gets data
    InitWithoutDots,      ///< BUS INIT: without its dots
    TightDescription,     ///< "AUTO,ISO ...", no blank behind the comma
    FirstNoData,          ///< the first request on a protocol gives NO DATA
    FramesTwice,          ///< each frame is printed twice
    PaddingCut,           ///< single frames are cut to their PCI length with headers on, too
    CountMessages,        ///< the expected-count digit counts whole messages
    CountIgnored,         ///< the expected-count digit is taken and means nothing
    RequestCut,           ///< only the first two bytes of a request go out
    FirstSwallowed,       ///< the first command of a connection gets no reply at all
    FirstPromptLost       ///< the first reply of a connection has no prompt
};

constexpr std::size_t quirkCount = 32;

/// A set of quirks.
class Quirks
{
public:
    Quirks() = default;
    Quirks(std::initializer_list<Quirk> quirks);

    void add(Quirk quirk);
    void add(Quirks const& others);
    bool has(Quirk quirk) const;

private:
    std::uint64_t m_bits = 0;
};

/// The quirk of a name such as "prompt-late".
std::optional<Quirk> findQuirk(std::string_view name);

/// All names, in the order of the enumeration.
std::vector<std::string> quirkNames();

} // namespace obdsim
