#include "simulator/car/codereader.h"

#include "simulator/car/monitornames.h"

namespace obdsim {

std::uint16_t readCode(TableReader& table, std::string_view key, std::string const& text)
{
    auto const code = parseCode(text);
    if (!code) {
        table.fail(key, "\"" + text + "\" is no trouble code such as P0133");
    }
    return *code;
}

std::vector<std::uint16_t> readCodes(TableReader& table, std::string_view key)
{
    std::vector<std::uint16_t> codes;
    for (auto const& text : table.texts(key)) {
        codes.push_back(readCode(table, key, text));
    }
    return codes;
}

} // namespace obdsim
