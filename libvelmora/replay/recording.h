#pragma once

#include "libvelmora/output/record.h"

#include <cstdint>
#include <map>
#include <string>
#include <vector>

namespace velmora {

// One value of a recorded sensor. Nothing where the recording says that there was none.
struct RecordedValue
{
    std::int64_t time = 0; // ms since 1970, UTC
    Reading::Value value;
};

struct RecordedSensor
{
    SensorEntry about;
    int decimals = 0;                  // the most that a value has
    bool numeric = true;               // every value is a number
    std::vector<RecordedValue> values; // in the order of time
};

// What a file of readings holds.
struct Recording
{
    std::vector<RecordedSensor> sensors;
    std::int64_t begin = 0; // of the first value
    std::int64_t end = 0;   // of the last one
    bool cut = false;       // it holds more than can be played
    bool dated = true;      // else its times count from a beginning that nobody has noted
};

// Puts a recording together of values in any order. One thread.
class RecordingMaker
{
public:
    static constexpr std::size_t mostValues = 2000000;
    static constexpr std::size_t mostSensors = 2000;

    // The sensor's number, new or known.
    std::size_t sensor(SensorEntry const& about);
    // A text that is a number is one. False if nothing more fits.
    bool add(std::size_t sensor, std::int64_t time, std::string const& text);
    bool add(std::size_t sensor, std::int64_t time, Reading::Value value);

    // The whole of it, in the order of time; sensors without values are left out.
    Recording finish();

private:
    Recording m_recording;
    std::map<std::string, std::size_t> m_numbers; // by module, key and unit
    std::size_t m_values = 0;
};

// "2026-03-01T08:15:00.250Z" as ms since 1970; nothing for a text of another form.
std::optional<std::int64_t> timeIn(std::string_view text);

} // namespace velmora
