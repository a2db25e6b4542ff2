#pragma once

namespace velmora {

inline constexpr int sqliteSchemaVersion = 2;
inline constexpr int sqliteApplicationId = 0x766C6D72; // "vlmr"

// Times are milliseconds since 1970, UTC. The readings lie in the order of time: that writes a small part of what the
// order of sensors would, which counts on an SD card.
inline constexpr char const* sqliteSchema = R"(
CREATE TABLE sensor (
    id      INTEGER PRIMARY KEY,
    vehicle TEXT NOT NULL,
    module  INTEGER NOT NULL,
    key     TEXT NOT NULL,
    pid     TEXT NOT NULL,
    name    TEXT NOT NULL,
    unit    TEXT NOT NULL,
    UNIQUE (vehicle, module, key, unit)
) STRICT;
CREATE TABLE reading (
    time   INTEGER NOT NULL,
    sensor INTEGER NOT NULL REFERENCES sensor (id),
    value  ANY,
    PRIMARY KEY (time, sensor)
) WITHOUT ROWID, STRICT;
CREATE TABLE module (
    vehicle     TEXT NOT NULL,
    id          INTEGER NOT NULL,
    name        TEXT NOT NULL,
    description TEXT NOT NULL,
    vin         TEXT,
    seen        INTEGER NOT NULL,
    PRIMARY KEY (vehicle, id)
) WITHOUT ROWID, STRICT;
CREATE TABLE code (
    id      INTEGER PRIMARY KEY,
    vehicle TEXT NOT NULL,
    module  INTEGER NOT NULL,
    code    TEXT NOT NULL,
    kind    TEXT NOT NULL,
    text    TEXT NOT NULL,
    since   INTEGER NOT NULL,
    gone    INTEGER
) STRICT;
CREATE TABLE event (
    id      INTEGER PRIMARY KEY,
    time    INTEGER NOT NULL,
    vehicle TEXT NOT NULL,
    module  INTEGER,
    kind    TEXT NOT NULL,
    text    TEXT NOT NULL
) STRICT;
CREATE TABLE trip (
    id            INTEGER PRIMARY KEY,
    vehicle       TEXT NOT NULL,
    begin         INTEGER NOT NULL,
    end           INTEGER NOT NULL,
    kind          TEXT NOT NULL,
    distance_km   REAL NOT NULL,
    odometer_km   REAL,
    duration_s    REAL NOT NULL,
    idle_s        REAL NOT NULL,
    gap_s         REAL NOT NULL,
    fuel_l        REAL,
    mean_kmh      REAL,
    max_kmh       REAL,
    max_rpm       REAL,
    max_coolant_c REAL
) STRICT;
)";

// What version 2 has beside those: rows that were dated by a clock that nobody had set yet, and which clock that is
// now.
inline constexpr char const* sqliteSchemaSince2 = R"(
CREATE TABLE undated (
    place  TEXT NOT NULL,
    time   INTEGER NOT NULL,
    number INTEGER NOT NULL,
    boot   TEXT NOT NULL
) STRICT;
CREATE TABLE clock (
    boot   TEXT NOT NULL,
    offset INTEGER NOT NULL
) STRICT;
)";

} // namespace velmora
