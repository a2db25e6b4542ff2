#pragma once

#include <cstddef>
#include <cstdint>
#include <deque>
#include <optional>

namespace obd {

// A reading and when it was taken, by tervex::currentMillis.
struct Sample
{
    std::uint32_t time{0};
    double value{0.0};
};

// Milliseconds from one time to another, negative if the second is the earlier one. Right across the clock's wrap.
constexpr std::int32_t elapsed(std::uint32_t from, std::uint32_t to)
{
    return static_cast<std::int32_t>(to - from);
}

// The two latest readings of an input. Inputs are read one after the other; the line through two readings tells what an
// input would have read at the time of another.
class SamplePair
{
public:
    // Both samples begin at time 0.
    explicit SamplePair(double initial = 0.0) : m_previous{0, initial}, m_newest{0, initial} {}

    void add(Sample const& sample)
    {
        m_previous = m_newest;
        m_newest = sample;
    }

    Sample const& previous() const { return m_previous; }
    Sample const& newest() const { return m_newest; }

    // The reading at a time, between the two samples or beyond. Nothing unless the newest is later than the previous.
    std::optional<double> at(std::uint32_t time) const
    {
        std::int32_t const span = elapsed(m_previous.time, m_newest.time);
        if (span <= 0) {
            return std::nullopt;
        }
        return m_previous.value + (m_newest.value - m_previous.value) / span * elapsed(m_previous.time, time);
    }

private:
    Sample m_previous;
    Sample m_newest;
};

// Samples over which a value is smoothed, oldest first.
class SampleList
{
public:
    void add(Sample const& sample) { m_samples.push_back(sample); }
    std::size_t size() const { return m_samples.size(); }

    void dropOldest() { m_samples.pop_front(); }

    // Drops samples from the oldest on, as long as they are older than that many milliseconds.
    void dropOlderThan(std::int32_t age, std::uint32_t now);

    // 0.0 if there are none.
    double mean() const;

private:
    std::deque<Sample> m_samples;
};

} // namespace obd
