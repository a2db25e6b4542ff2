#include "libvelmora/report/troublecode.h"

#include "libvelmora/report/json.h"

#include <algorithm>

namespace velmora {

std::vector<TroubleCode> groupByCode(std::vector<std::shared_ptr<obd::DtcDataModel>> const& models)
{
    std::vector<TroubleCode> codes;
    for (std::shared_ptr<obd::DtcDataModel> const& model : models) {
        auto found = std::find_if(codes.begin(), codes.end(),
                                  [&model](TroubleCode const& code) { return code.code == model->code; });
        if (found == codes.end()) {
            found = codes.insert(codes.end(), {model->code, model->system, {}});
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
        meanings.push_back({{"maker", meaning.maker}, {"text", meaning.text}});
    }
    return {{"code", code.code}, {"system", code.system}, {"meanings", meanings}};
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
