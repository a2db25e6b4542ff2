#pragma once

#include "libvelmora/output/mqtt/spool.h"
#include "libvelmora/output/record.h"

#include <string>
#include <vector>

namespace velmora {

// What of a record goes through a spool: an array for a reading, an object for all else; empty for what stays here.
// Times are milliseconds since 1970.
std::string spoolText(Record const& record);

// The same with its times moved.
std::string shiftedText(std::string const& text, std::int64_t millis);

// The message that carries rows of one kind of time; see docs/watch.md. after is the number of the row before, stored
// the one up to which all is known to be kept.
struct BatchHead
{
    std::string vehicle;
    std::string spool;
    std::int64_t after = 0;
    std::int64_t stored = 0;
};
std::string batchText(BatchHead const& head, std::vector<Spool::Row> const& rows);

} // namespace velmora
