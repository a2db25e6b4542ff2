#pragma once

#include "libvelmora/report/jsonplace.h"
#include "libvelmora/report/vehiclereport.h"

// The topics of a control module as their JSON tells them. Each throws Error that names the place that is not as it
// should be.

namespace velmora {

TopicAnswer answerAt(JsonPlace const& place);
CodeReport codesAt(JsonPlace const& place);
FreezeReport freezeAt(JsonPlace const& place, MakerChoice const& maker);
ReadinessReport readinessAt(JsonPlace const& place);
MonitorsReport monitorsAt(JsonPlace const& place);
OxygenReport oxygenAt(JsonPlace const& place);
CountersReport countersAt(JsonPlace const& place);

} // namespace velmora
