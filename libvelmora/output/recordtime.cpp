#include "libvelmora/output/recordtime.h"

namespace velmora {

namespace {

struct TimeOf
{
    WallTime operator()(Trip const& trip) const { return trip.end; }
    WallTime operator()(auto const& record) const { return record.time; }
};

struct Shift
{
    std::chrono::milliseconds step;

    void operator()(Trip& trip) const
    {
        trip.begin += step;
        trip.end += step;
    }
    void operator()(auto& record) const { record.time += step; }
};

} // namespace

WallTime timeOf(Record const& record)
{
    return std::visit(TimeOf(), record);
}

Record shifted(Record record, std::chrono::milliseconds step)
{
    std::visit(Shift{step}, record);
    return record;
}

} // namespace velmora
