#include "simulator/fault.h"

#include "simulator/textnumber.h"

#include <algorithm>
#include <iterator>

namespace obdsim {

namespace {

/// The forms of one kind of fault: NAME=P by chance, NAME@N at a place, NAME=MS.
struct FaultForm
{
    char const* name;
    FaultKind kind;
    bool chance;
    bool place;
    bool time; ///< behind the place as ":MS", or alone as "=MS"
};

constexpr FaultForm forms[] = {
    {"garbage", FaultKind::Garbage, true, false, false}, {"nul", FaultKind::Nul, true, false, false},
    {"prompt", FaultKind::Prompt, true, true, false},    {"cut", FaultKind::Cut, false, true, false},
    {"stall", FaultKind::Stall, false, true, true},      {"slow", FaultKind::Slow, false, false, true},
    {"loss", FaultKind::Loss, false, true, false},       {"error", FaultKind::Error, true, true, false},
    {"silent", FaultKind::Silent, false, true, false},   {"reset", FaultKind::Reset, false, true, false},
};

constexpr char const* usage =
    "the faults are garbage=P, nul=P, prompt=P, prompt@COMMAND, cut@BYTE, stall@BYTE:MS, slow=MS, loss@BYTE, "
    "error:WORDS@COMMAND, error:WORDS=P, silent@COMMAND, reset@COMMAND, reset:banner@COMMAND, reset:WORDS@COMMAND, "
    "echo, "
    "quirk:NAME, command=MS, wait=MS, baud=RATE and seed=N";

[[noreturn]] void fail(std::string const& text, std::string const& why)
{
    throw FaultError("fault \"" + text + "\": " + why);
}

/// Splits at the last of `character`; the second part is empty if there is none.
std::pair<std::string, std::string> splitAtLast(std::string const& text, char character)
{
    auto const at = text.rfind(character);
    if (at == std::string::npos) {
        return {text, ""};
    }
    return {text.substr(0, at), text.substr(at + 1)};
}

std::pair<std::string, std::string> splitAtFirst(std::string const& text, char character)
{
    auto const at = text.find(character);
    return at == std::string::npos ? std::pair(text, std::string())
                                   : std::pair(text.substr(0, at), text.substr(at + 1));
}

std::optional<std::uint64_t> wholeNumber(std::string const& text)
{
    bool const digits = !text.empty() && text.size() < 10 && text.find_first_not_of("0123456789") == std::string::npos;
    return digits ? std::optional<std::uint64_t>(std::stoull(text)) : std::nullopt;
}

double probability(std::string const& fault, std::string const& text)
{
    auto const value = parseDecimal(text);
    if (!value || *value < 0 || *value > 1) {
        fail(fault, "a probability is a number from 0 to 1");
    }
    return *value;
}

Time timeOf(std::string const& fault, std::string const& text)
{
    auto const value = wholeNumber(text);
    if (!value) {
        fail(fault, "a time is a whole number of milliseconds");
    }
    return Ms(*value);
}

std::uint64_t position(std::string const& fault, std::string const& text)
{
    auto const value = wholeNumber(text);
    if (!value || *value == 0) {
        fail(fault, "a place is a whole number from 1 on");
    }
    return *value;
}

Fault parseAtPlace(std::string const& text, FaultForm const& form, Fault fault, std::string const& place)
{
    if (!form.place) {
        fail(text, usage);
    }
    auto const [number, time] = splitAtLast(place, ':');
    fault.position = position(text, number);
    if (form.time) {
        fault.duration = timeOf(text, time);
    } else if (number != place) {
        fail(text, usage);
    }
    return fault;
}

Fault parseByValue(std::string const& text, FaultForm const& form, Fault fault, std::string const& value)
{
    if (form.chance) {
        fault.probability = probability(text, value);
    } else if (form.time && !form.place) {
        fault.duration = timeOf(text, value);
    } else {
        fail(text, usage);
    }
    return fault;
}

Quirk parseQuirk(std::string const& text, std::string const& name)
{
    auto const quirk = findQuirk(name);
    if (!quirk) {
        std::string names;
        for (auto const& known : quirkNames()) {
            names += names.empty() ? known : ", " + known;
        }
        fail(text, "the quirks are " + names);
    }
    return *quirk;
}

std::uint32_t parseSeed(std::string const& text, std::string const& number)
{
    auto const value = wholeNumber(number);
    if (!value) {
        fail(text, "a seed is a whole number");
    }
    return static_cast<std::uint32_t>(*value);
}

/// The line rates that adapters are made for lie in between.
int parseBaud(std::string const& text, std::string const& value)
{
    constexpr std::uint64_t slowest = 300;
    constexpr std::uint64_t fastest = 4'000'000;
    auto const baud = wholeNumber(value);
    if (!baud || *baud < slowest || *baud > fastest) {
        fail(text, "a line rate is a number from 300 to 4000000");
    }
    return static_cast<int>(*baud);
}

} // namespace

Fault parseFault(std::string const& text)
{
    auto const mark = text.find_first_of("=@:");
    std::string const name = text.substr(0, mark);
    auto const form =
        std::find_if(std::begin(forms), std::end(forms), [&](FaultForm const& f) { return f.name == name; });
    if (form == std::end(forms) || mark == std::string::npos) {
        fail(text, usage);
    }
    Fault fault;
    fault.kind = form->kind;
    std::string rest = text.substr(mark);
    bool const mayHaveWords = form->kind == FaultKind::Reset && rest[0] == ':';
    if (form->kind == FaultKind::Error || mayHaveWords) {
        auto const end = rest.find_last_of("=@");
        if (rest[0] != ':' || end == std::string::npos || end < 2) {
            fail(text, usage);
        }
        fault.word = rest.substr(1, end - 1);
        rest = rest.substr(end);
    }
    if (rest[0] == '@') {
        return parseAtPlace(text, *form, fault, rest.substr(1));
    }
    if (rest[0] == '=') {
        return parseByValue(text, *form, fault, rest.substr(1));
    }
    fail(text, usage);
}

FaultPlan parseFaults(std::vector<std::string> const& texts)
{
    std::string const quirk = "quirk:";
    FaultPlan plan;
    for (auto const& text : texts) {
        auto const [name, value] = splitAtFirst(text, '=');
        if (text == "echo") {
            plan.quirks.add(Quirk::EchoStuck);
        } else if (text.compare(0, quirk.size(), quirk) == 0) {
            plan.quirks.add(parseQuirk(text, text.substr(quirk.size())));
        } else if (name == "seed") {
            plan.seed = parseSeed(text, value);
        } else if (name == "command") {
            plan.command = timeOf(text, value);
        } else if (name == "wait") {
            plan.wait = timeOf(text, value);
        } else if (name == "baud") {
            plan.baud = parseBaud(text, value);
        } else {
            plan.faults.push_back(parseFault(text));
        }
    }
    return plan;
}

} // namespace obdsim
