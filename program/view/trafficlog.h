#pragma once

#include <obd/messagedatamodel.h>

#include <string>

namespace velmora::cli {

// One entry of the traffic log as one line: its time of day, ">>" towards the adapter or "<<" from it, the text.
std::string toLine(obd::MessageDataModel const& entry);

// The same as one line of JSON.
std::string toJsonLine(obd::MessageDataModel const& entry);

} // namespace velmora::cli
