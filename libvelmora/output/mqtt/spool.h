#pragma once

#include "libvelmora/output/ballast.h"
#include "libvelmora/output/clockkeeper.h"
#include "libvelmora/output/database/database.h"

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace velmora {

// What waits to be sent, on the disk. A row is known by the spool's random id and its number, never by its time:
// numbers rise and are never used again, also after all rows are gone. For one thread at a time.
class Spool final : public IHeldRows
{
public:
    // What is known of the time in a row. It may change while the row is held, and never after that.
    enum class Time
    {
        Held = 0, // the clock may still be set: not to be sent yet
        Sure = 1,
        Unsure = 2, // as the clock was, which nobody has set
    };
    static Time timeBy(ClockJudge::Trust trust);

    struct Row
    {
        std::int64_t seq = 0;
        Time time = Time::Sure;
        std::string text;
    };

    // Above so many bytes the oldest rows make room. Throws Error.
    Spool(std::string const& file, unsigned long long maxBytes);

    // 16 hexadecimal digits, new with each new file.
    std::string const& id() const { return m_id; }

    // All of them or none. Throws Error.
    void add(std::vector<std::string> const& texts, Time time = Time::Sure);
    // The first rows behind that number, up to the first that is held.
    std::vector<Row> after(std::int64_t seq, std::size_t most);
    // Forgets all up to that number.
    void forget(std::int64_t seq);
    // The highest number that was ever given.
    std::int64_t newest();

    // Makes room if the file is too large; the numbers that were lost are told as first and last, 0 for none.
    struct Gap
    {
        std::int64_t first = 0;
        std::int64_t last = 0;
    };
    Gap makeRoom();

    // Held rows.
    std::optional<ClockStamp> heldStamp() override;
    void keepStamp(ClockStamp const& stamp) override;
    void shiftHeld(std::int64_t millis, ClockStamp const& stamp) override;
    void release(ClockJudge::Trust trust) override;

    std::int64_t rows() { return m_database.number("SELECT count(*) FROM row"); }
    // How many there are at most, without counting them.
    std::int64_t span();
    // How many makeRoom has dropped, ever.
    std::int64_t dropped() { return m_database.number("SELECT dropped FROM meta"); }

private:
    void prepare();
    std::int64_t usedBytes();
    void writeStamp(ClockStamp const& stamp);
    template <typename Work>
    void change(Work const& work);

    Database m_database;
    Ballast m_ballast;
    unsigned long long const m_maxBytes;
    std::string m_id;
};

} // namespace velmora
