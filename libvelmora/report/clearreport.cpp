#include "libvelmora/report/clearreport.h"

namespace velmora {

char const* resultWord(ClearReport::Result result)
{
    static constexpr char const* words[] = {"cleared", "refused", "no answer", "the reply can't be read"};
    return words[static_cast<int>(result)];
}

Json toJsonValue(ClearReport const& report)
{
    return {{"cleared", report.result == ClearReport::Result::Cleared},
            {"result", resultWord(report.result)},
            {"reason", textOrNull(report.reason)}};
}

} // namespace velmora
