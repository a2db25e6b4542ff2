#include "libvelmora/report/countersreport.h"

namespace velmora {

Json toJsonValue(CountersReport const& report)
{
    Json counters = Json::array();
    for (CountersReport::Counter const& counter : report.counters) {
        counters.push_back({{"name", counter.name}, {"value", counter.value}});
    }
    return {{"answer", answerWord(report.answer)}, {"counters", counters}};
}

} // namespace velmora
