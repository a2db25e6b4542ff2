#include "libvelmora/replay/readdatabase.h"

#include <velmora/error.h>

#ifdef VELMORA_OUTPUT_SQLITE
#include "libvelmora/output/database/database.h"
#include "libvelmora/output/database/sqliteschema.h"
#include "libvelmora/output/valuetext.h"

#include <map>
#endif

namespace velmora {

#ifdef VELMORA_OUTPUT_SQLITE

namespace {

void addReading(RecordingMaker& maker, std::size_t sensor, Statement const& row, bool& more)
{
    std::int64_t const time = row.number(0);
    if (row.isNull(2)) {
        more = maker.add(sensor, time, Reading::Value());
    } else {
        more = maker.add(sensor, time, row.isText(2) ? row.text(2) : numberText(row.real(2)));
    }
}

} // namespace

Recording readDatabase(std::filesystem::path const& file)
{
    Database database(file.string(), Database::Access::ReadOnly);
    if (database.number("PRAGMA application_id") != sqliteApplicationId ||
        database.number("PRAGMA user_version") != sqliteSchemaVersion) {
        throw Error(ErrorKind::WrongUse, file.string() + " is no database of the output sqlite",
                    {"record one by `velmora watch --output sqlite:FILE`, or by the key w of the live view"});
    }
    RecordingMaker maker;
    std::map<std::int64_t, std::size_t> numbers;
    Statement sensors(database, "SELECT id, module, key, pid, name, unit FROM sensor ORDER BY id");
    while (sensors.next()) {
        numbers[sensors.number(0)] = maker.sensor({static_cast<unsigned int>(sensors.number(1)), sensors.text(2),
                                                   sensors.text(3), sensors.text(4), sensors.text(5)});
    }
    Statement readings(database, "SELECT time, sensor, value FROM reading ORDER BY time");
    for (bool more = true; more && readings.next();) {
        auto const sensor = numbers.find(readings.number(1));
        if (sensor != numbers.end()) {
            addReading(maker, sensor->second, readings, more);
        }
    }
    return maker.finish();
}

#else

Recording readDatabase(std::filesystem::path const& file)
{
    throw Error(ErrorKind::NotSupported, "This build can't read the database " + file.string(),
                {"velmora --version lists what it has"});
}

#endif

} // namespace velmora
