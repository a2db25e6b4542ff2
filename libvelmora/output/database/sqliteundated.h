#pragma once

#include "libvelmora/output/clockkeeper.h"
#include "libvelmora/output/database/database.h"

namespace velmora {

// The rows of a database that were dated by a clock that nobody had set yet. They are repaired in their tables, so that
// a power cut meanwhile costs no more than at any other time. Part of the transaction that is under way.
class SqliteUndated final : public IHeldRows
{
public:
    // Which time of which table. A row is known by that and by a number: the sensor, or the module or 0.
    static constexpr char const* reading = "reading";
    static constexpr char const* event = "event";
    static constexpr char const* trip = "trip";
    static constexpr char const* module = "module";
    static constexpr char const* code = "code";
    static constexpr char const* codeGone = "code gone";

    // It must outlive this.
    explicit SqliteUndated(Database& database);

    void add(char const* place, std::int64_t time, std::int64_t number);

    std::optional<ClockStamp> heldStamp() override;
    void keepStamp(ClockStamp const& stamp) override;
    void shiftHeld(std::int64_t millis, ClockStamp const& stamp) override;
    // Those of which nobody will ever know how wrong they are stay in the list.
    void release(ClockJudge::Trust trust) override;

private:
    void shiftReadings(std::int64_t millis, std::string const& boot);

    Database& m_database;
    Statement m_add;
};

} // namespace velmora
