#include "libvelmora/report/troublecode.h"

#include "libvelmora/report/json.h"
#include "libvelmora/report/texts/labels.h"

#include <fmt/format.h>

#include <algorithm>

namespace velmora {

namespace {

TroubleCode::Meaning const* findMeaning(TroubleCode const& code, std::string const& maker)
{
    auto const found = std::find_if(code.meanings.begin(), code.meanings.end(),
                                    [&maker](TroubleCode::Meaning const& meaning) { return meaning.maker == maker; });
    return found != code.meanings.end() ? &*found : nullptr;
}

Json toJson(TroubleCode::Meaning const& meaning)
{
    return {{"maker", meaning.maker}, {"text", meaning.text}};
}

} // namespace

bool isMakersCode(std::string const& code)
{
    if (code.size() < 3) {
        return false;
    }
    if (code[0] == 'P') {
        return code[1] == '1' || (code[1] == '3' && code[2] < '4');
    }
    return code[1] == '1' || code[1] == '2';
}

TroubleCode::Meaning const* meaningOf(TroubleCode const& code)
{
    // "Unknown" is the catalogue's word for a maker's code that it does not have.
    std::string const generic = "Generic";
    bool const makerFirst = isMakersCode(code.code);
    for (std::string const& maker :
         {makerFirst ? code.maker : generic, makerFirst ? generic : code.maker, std::string("Unknown")}) {
        if (TroubleCode::Meaning const* const meaning = findMeaning(code, maker)) {
            return meaning;
        }
    }
    return nullptr;
}

std::string meaningText(TroubleCode const& code)
{
    if (TroubleCode::Meaning const* const meaning = meaningOf(code)) {
        return meaning->text;
    }
    std::size_t const count = code.meanings.size();
    char const* const others = code.maker.empty() ? "" : texts::ofOtherMakers;
    return count == 1 ? fmt::format(texts::meaningsOne, count, others)
                      : fmt::format(texts::meaningsMany, count, others);
}

std::vector<TroubleCode> groupByCode(std::vector<std::shared_ptr<obd::DtcDataModel>> const& models)
{
    std::vector<TroubleCode> codes;
    for (std::shared_ptr<obd::DtcDataModel> const& model : models) {
        auto found = std::find_if(codes.begin(), codes.end(),
                                  [&model](TroubleCode const& code) { return code.code == model->code; });
        if (found == codes.end()) {
            found = codes.insert(codes.end(), {model->code, model->system, {}, {}});
        }
        TroubleCode::Meaning const meaning{model->manufacturer, model->description};
        if (std::find(found->meanings.begin(), found->meanings.end(), meaning) == found->meanings.end()) {
            found->meanings.push_back(meaning);
        }
    }
    return codes;
}

Json toJsonValue(TroubleCode const& code)
{
    Json meanings = Json::array();
    for (TroubleCode::Meaning const& meaning : code.meanings) {
        meanings.push_back(toJson(meaning));
    }
    TroubleCode::Meaning const* const holds = meaningOf(code);
    return {{"code", code.code},
            {"system", code.system},
            {"meaning", holds != nullptr ? toJson(*holds) : Json(nullptr)},
            {"meanings", meanings}};
}

Json toJsonValue(std::vector<TroubleCode> const& codes)
{
    Json list = Json::array();
    for (TroubleCode const& code : codes) {
        list.push_back(toJsonValue(code));
    }
    return list;
}

} // namespace velmora
