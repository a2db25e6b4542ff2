#include "libobd/dispatch/pacedupdate.h"

#include <common/clock.h>
#include <obd/iquery.h>

namespace obd {
namespace {

constexpr unsigned int floorMillis = 30;

} // namespace

bool pacedUpdate(IQuery& query, std::shared_ptr<IObdProxy> const& proxy)
{
    unsigned int const start = tervex::currentMillis();
    if (query.update(proxy) != IQuery::UpdateStatus::UpdateOk) {
        return false;
    }
    unsigned int const duration = tervex::currentMillis() - start;
    if (duration < floorMillis) {
        tervex::sleepMillis(floorMillis - duration);
    }
    return true;
}

} // namespace obd
