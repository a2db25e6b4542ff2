#pragma once

#include <velmora/recording.h>

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <string_view>

namespace velmora {

// Puts a recording together of values in any order. One thread.
class RecordingMaker
{
public:
    static constexpr std::size_t mostSensors = 2000;
    static constexpr std::size_t mostValues = 2000000; // of all sensors together
    static constexpr std::size_t noRoom = std::string::npos;

    explicit RecordingMaker(std::size_t most = mostValues) : m_mostValues(most) {}

    // The sensor's number, new or known; noRoom if there are too many already.
    std::size_t sensor(SensorEntry const& about);
    // A text that is a number is one. False if nothing more fits.
    bool add(std::size_t sensor, std::int64_t time, std::string const& text);
    bool add(std::size_t sensor, std::int64_t time, Reading::Value value);

    // The whole of it, in the order of time; sensors without values are left out.
    Recording finish();

private:
    std::size_t const m_mostValues;
    Recording m_recording;
    std::map<std::string, std::size_t> m_numbers; // by module, key and unit
    std::size_t m_values = 0;
};

// "2026-03-01T08:15:00.250Z" as ms since 1970; nothing for a text of another form.
std::optional<std::int64_t> timeIn(std::string_view text);

} // namespace velmora
