#include "libobd/catalogue/dtcreader.h"

#include <obd/troublecodecatalogue.h>

#include <algorithm>
#include <string_view>

namespace obd {

namespace {

bool isOneOf(std::string_view characters, char character)
{
    return characters.find(character) != std::string_view::npos;
}

} // namespace

bool TroubleCodeCatalogue::isTroubleCode(std::string const& text)
{
    return text.size() == 5 && isOneOf("PBCU", text[0]) && isOneOf("0123", text[1]) &&
           std::all_of(text.begin() + 2, text.end(), [](char digit) { return isOneOf("0123456789ABCDEF", digit); });
}

std::vector<std::shared_ptr<DtcDataModel>> TroubleCodeCatalogue::getTroubleCodes(std::string const& code)
{
    return isTroubleCode(code) ? DtcReader().getTroubleCodes(code) : std::vector<std::shared_ptr<DtcDataModel>>{};
}

std::vector<std::shared_ptr<DtcDataModel>> TroubleCodeCatalogue::getRows()
{
    return DtcReader().getRows();
}

} // namespace obd
