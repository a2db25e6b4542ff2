#include "libvelmora/signal/builtinpids.h"

#include "libvelmora/signal/formulaparser.h"

#include <algorithm>
#include <cctype>
#include <iterator>
#include <map>
#include <string>

namespace velmora {

namespace {

struct PidRow
{
    unsigned char pid;
    std::size_t length;
    char const* id;
    char const* name;
    std::string_view supportedIf;
    std::string_view formula;
    std::string_view unit; // or what its numbers mean: "0 sustaining; 1 depleting"
    double min;
    double max;
    int precision;
    PidStanding standing;
};

constexpr PidRow pidRows[] = {
#include "libvelmora/signal/pidrows.inc"
};

static_assert(std::size(pidRows) == 160);

// "0 sustaining; 1 depleting"; nothing for a unit, none of which begins with a digit.
std::map<long, std::string> statesOf(std::string_view text)
{
    std::map<long, std::string> states;
    while (!text.empty() && std::isdigit(static_cast<unsigned char>(text.front())) != 0) {
        std::size_t const end = std::min(text.find("; "), text.size());
        std::string const part(text.substr(0, end));
        states[std::stol(part)] = part.substr(part.find(' ') + 1);
        text.remove_prefix(std::min(end + 2, text.size()));
    }
    return states;
}

BuiltinPid toBuiltin(PidRow const& row)
{
    BuiltinPid result;
    result.pid = row.pid;
    result.length = row.length;
    result.standing = row.standing;
    Signal& signal = result.signal;
    signal.id = row.id;
    signal.name = row.name;
    signal.request = {0x01, row.pid};
    signal.values = statesOf(row.unit);
    signal.unit = signal.values.empty() ? row.unit : "";
    signal.min = row.min;
    signal.max = row.max;
    signal.precision = row.precision;
    if (!row.formula.empty()) {
        signal.formula = parseFormula(row.formula, FormulaDialect::Phone);
    }
    if (!row.supportedIf.empty()) {
        result.supported = parseFormula(row.supportedIf, FormulaDialect::Phone);
    }
    if (row.standing == PidStanding::Listed) {
        signal.reason = "one source";
    }
    return result;
}

std::vector<BuiltinPid> makeBuiltins()
{
    std::vector<BuiltinPid> builtins;
    for (PidRow const& row : pidRows) {
        builtins.push_back(toBuiltin(row));
    }
    return builtins;
}

} // namespace

std::vector<BuiltinPid> const& builtinPids()
{
    static std::vector<BuiltinPid> const builtins = makeBuiltins();
    return builtins;
}

bool isDecoded(BuiltinPid const& pid)
{
    return pid.signal.formula.has_value();
}

std::string_view standingWord(PidStanding standing)
{
    switch (standing) {
    case PidStanding::Recorded:
        return "recorded";
    case PidStanding::Replies:
        return "layout from replies";
    case PidStanding::Agreed:
        return "agreed";
    case PidStanding::Listed:
        return "one source";
    case PidStanding::Unverified:
        return "unverified";
    case PidStanding::NameOnly:
        return "name only";
    }
    return "";
}

} // namespace velmora
