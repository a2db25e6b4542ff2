#include "common/text/text.h"
#include "libvelmora/report/troublecode.h"
#include "libvelmora/session/libraryuse.h"

#include <obd/troublecodecatalogue.h>
#include <velmora/catalogue.h>
#include <velmora/error.h>

#include <fmt/format.h>

namespace velmora {

namespace {

// A generic meaning holds for every maker's vehicles.
void keepMaker(TroubleCode& code, std::string const& maker)
{
    std::erase_if(code.meanings, [&maker](TroubleCode::Meaning const& meaning) {
        return meaning.maker != maker && meaning.maker != "Generic";
    });
    if (code.meanings.empty()) {
        code.meanings.push_back({maker, "Unknown Trouble Code"});
    }
    code.maker = maker;
}

} // namespace

TroubleCode explain(std::string const& code)
{
    LibraryUse const catalogue{std::string()};
    std::vector<TroubleCode> const found = groupByCode(obd::TroubleCodeCatalogue::getTroubleCodes(toUpper(code)));
    if (found.empty()) {
        throw Error(ErrorKind::WrongUse, fmt::format("\"{}\" is no trouble code", code),
                    {"a trouble code is P, B, C or U, a digit from 0 to 3 and three hexadecimal digits: P0420"});
    }
    return found.front();
}

TroubleCode explain(std::string const& code, std::string const& maker)
{
    TroubleCode found = explain(code);
    if (!maker.empty()) {
        keepMaker(found, maker);
    }
    return found;
}

} // namespace velmora
