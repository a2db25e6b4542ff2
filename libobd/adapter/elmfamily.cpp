#include "libobd/adapter/elmfamily.h"

#include <algorithm>

namespace obd {
namespace {

// An answer of this length is taken for an adapter's, whatever it says.
constexpr std::size_t shortestIdentity = 5;

using enum BaudRateDialogue;

// A name line is read by the first row that fits and has a label.
constexpr ElmFamily families[] = {
    // clang-format off
    // word         label            version describe  identify  number   voltage  store  try     echoes rate
    {"OBDPRO",      "",                   0, "",       "",       "",      "",      "",    "",     false, Code},
    {elmFamilyWord, "ELM interface: ",    2, "",       "",       "",      "",      "",    "",     false, Inherited},
    {"OBDKEY",      "OBDKey interface: ", 2, "",       "",       "",      "",      "",    "",     false, Refused},
    {"DIAMEX",      "Diamex interface: ", 3, "AT!01",  "AT!00",  "ATN",   "AT!10", "ATP", "ATPA", true,  Inherited},
    {"PLXKIWI",     "Kiwi interface: ",   2, "",       "",       "",      "",      "",    "",     false, Inherited},
    {"",            "",                   0, "AT@1",   "AT@2",   "ATDPN", "ATRV",  "ATSP", "ATTP", false, Divisor},
    // clang-format on
};

} // namespace

std::span<ElmFamily const> elmFamilies()
{
    return families;
}

ElmFamily const* recogniseFamily(std::string const& nameLine)
{
    std::string const name = toUpper(nameLine);
    auto const found = std::find_if(std::begin(families), std::end(families), [&name](ElmFamily const& family) {
        return !family.label.empty() && hasResponse(name, family.word);
    });
    return found != std::end(families) ? found : nullptr;
}

bool isInterfaceSupported(std::string const& reply)
{
    std::string const text = toUpper(reply);
    return text.size() >= shortestIdentity ||
           std::any_of(std::begin(families), std::end(families), [&text](ElmFamily const& family) {
               return !family.word.empty() && hasResponse(text, family.word);
           });
}

} // namespace obd
