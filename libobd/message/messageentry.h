#pragma once

#include <obd/messagedatamodel.h>

#include <memory>
#include <vector>

namespace obd {

// The row of the traffic log for bytes that went by just now; direction is one of MessageDataModel's two.
std::shared_ptr<MessageDataModel> makeMessageEntry(std::vector<unsigned char> const& bytes, int direction);

} // namespace obd
