#pragma once

#include "libvelmora/report/moduletopic.h"

#include <obd/outcome.h>

#include <string>

namespace velmora {

// How asking a control module for a topic went.
TopicAnswer toAnswer(obd::Verdict const& verdict);

// The words for a refusal's code, such as "conditions not correct (22)"; empty for none.
std::string refusalText(int code);

} // namespace velmora
