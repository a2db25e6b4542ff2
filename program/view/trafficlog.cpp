#include "program/view/trafficlog.h"

#include <fmt/format.h>
#include <nlohmann/json.hpp>

namespace velmora::cli {

std::string toLine(obd::MessageDataModel const& entry)
{
    return fmt::format("{} {} {}\n", entry.time, entry.getDirectionStr(), entry.data);
}

std::string toJsonLine(obd::MessageDataModel const& entry)
{
    nlohmann::ordered_json const line = {
        {"time", entry.time},
        {"direction", entry.direction == obd::MessageDataModel::Sent ? "sent" : "received"},
        {"data", entry.data},
    };
    return line.dump(-1, ' ', false, nlohmann::ordered_json::error_handler_t::replace) + "\n";
}

} // namespace velmora::cli
