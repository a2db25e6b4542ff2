#include "libvelmora/channel/replylines.h"

#include "libvelmora/channel/elmcommand.h"

#include <algorithm>
#include <iterator>

namespace velmora {

namespace {

// As they read without blanks.
constexpr std::string_view adapterErrors[] = {
    "NODATA",      "UNABLETOCONNECT", "BUFFERFULL",   "BUSBUSY",       "BUSERROR",         "CANERROR", "DATAERROR",
    "FBERROR",     "LVRESET",         "RXERROR",      "STOPPED",       "ACTALERT",         "LPALERT",  "FCRXTIMEOUT",
    "OUTOFMEMORY", "UARTRXOVERFLOW",  "NOTCONNECTED", "BUSINIT:ERROR", "BUSINIT:...ERROR",
};

bool isAllHex(std::string_view text)
{
    return !text.empty() && std::all_of(text.begin(), text.end(), [](char c) { return hexDigitValue(c) >= 0; });
}

bool holdsError(std::string_view text)
{
    bool const holds = std::any_of(std::begin(adapterErrors), std::end(adapterErrors),
                                   [text](std::string_view word) { return text.find(word) != std::string_view::npos; });
    return holds || text.starts_with("ERR");
}

// "SEARCHING..." and "BUS INIT: ...OK", with or without their dots; what a bus start ends in stays if it is an error.
bool takeNotice(std::string& text)
{
    auto const skipDots = [&text](std::size_t at) { return std::min(text.find_first_not_of('.', at), text.size()); };
    constexpr std::string_view searching = "SEARCHING";
    constexpr std::string_view starting = "BUSINIT:";
    if (text.starts_with(searching)) {
        text.erase(0, skipDots(searching.size()));
        return true;
    }
    if (text.starts_with(starting)) {
        std::size_t const end = skipDots(starting.size());
        std::string const rest = text.substr(end);
        if (rest.empty() || rest.starts_with("OK")) {
            text = rest.empty() ? rest : rest.substr(2);
            return true;
        }
    }
    return false;
}

} // namespace

std::vector<ReplyLine> splitReply(std::string_view raw, HabitCounts& counts)
{
    std::vector<ReplyLine> lines;
    ReplyLine line{{}, false};
    auto const finish = [&lines, &line] {
        if (line.text.find_first_not_of(' ') != std::string::npos) {
            lines.push_back(line);
        }
        line = {{}, false};
    };
    for (char const character : raw) {
        if (character == '\r' || character == '\n') {
            finish();
        } else if (character >= ' ' && character < '\x7F') {
            line.text += character;
        } else if (character != '\t') {
            ++counts[static_cast<std::size_t>(Habit::StrayBytes)];
            // The data sheet tells of NULs that come in between and mean nothing; others may stand for a lost byte.
            line.stray = line.stray || character != '\0';
        }
    }
    finish();
    return lines;
}

ClassifiedLine classifyLine(std::string_view line)
{
    std::string text = compactText(line);
    bool hadNotice = false;
    while (takeNotice(text)) {
        hadNotice = true;
    }
    if (text == "OK" || (text.empty() && hadNotice)) {
        return {LineKind::Notice, true, {}};
    }
    LineKind kind = LineKind::Text;
    if (isAllHex(text)) { // no word of trouble is
        kind = LineKind::Data;
    } else if (text.find("<DATAERROR") != std::string::npos || text.find("<RXERROR") != std::string::npos) {
        kind = LineKind::Flagged;
    } else if (holdsError(text)) {
        kind = LineKind::Error;
    } else if (text == "?") {
        kind = LineKind::Refused;
    }
    return {kind, hadNotice, text};
}

bool tellsReset(std::string_view line)
{
    std::string const text = compactText(line);
    constexpr std::string_view banner = "ELM327V";
    bool const internalError = text.size() == 5 && text.starts_with("ERR") && text[3] >= '0' && text[3] <= '9';
    return text.find(banner) != std::string::npos || text.find("LVRESET") != std::string::npos || internalError;
}

} // namespace velmora
