#include "common/text/text.h"
#include "libvelmora/replay/recordingfile.h"
#include "libvelmora/report/json.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <string>

namespace velmora {

namespace {

std::string textOf(Json const& line, char const* key)
{
    auto const found = line.find(key);
    return found != line.end() && found->is_string() ? found->get<std::string>() : std::string();
}

// A number keeps the digits that it was written with.
std::string valueOf(Json const& value)
{
    return value.is_string() ? value.get<std::string>() : value.is_number() ? value.dump() : std::string();
}

bool isReading(Json const& line)
{
    return line.is_object() && line.contains("value") && line.contains("name");
}

} // namespace

Recording readNdjson(std::istream& in, std::size_t mostValues)
{
    RecordingMaker maker(mostValues);
    std::string text;
    for (std::size_t number = 1; std::getline(in, text); ++number) {
        Json const line = Json::parse(text, nullptr, false);
        if (line.is_discarded() && !text.empty() && !in.eof()) {
            throw Error(ErrorKind::WrongUse, fmt::format("Line {} can't be played: it is no JSON", number),
                        {"a recording of live --json, or of the output ndjson, is wanted"});
        }
        std::optional<std::int64_t> const time =
            isReading(line) ? timeIn(textOf(line, "time")) : std::nullopt; // others tell of events and trips
        if (!time) {
            continue;
        }
        std::string const key = textOf(line, "sensor");
        std::string const name = textOf(line, "name");
        SensorEntry const entry{parseHex(textOf(line, "module"), 0x1FFFFFFF).value_or(0), key.empty() ? name : key,
                                textOf(line, "pid"), name, textOf(line, "unit")};
        if (!maker.add(maker.sensor(entry), *time, valueOf(line["value"]))) {
            break;
        }
    }
    return maker.finish();
}

} // namespace velmora
