#pragma once

// The words of reports as plain text that the other forms say otherwise: their labels have 14 columns. Braces are
// filled in by whoever uses the text.

namespace velmora::texts::plain {

inline constexpr char const* volts = "Voltage";
inline constexpr char const* number = "Number";
inline constexpr char const* noFindings = "none in what the vehicle told";

// Trouble codes.
inline constexpr char const* refusedBecause = "refused: {}";
inline constexpr char const* codeNoun = "code";
inline constexpr char const* meanings = "Meanings";
inline constexpr char const* listOf = "{}'s";
inline constexpr char const* listByVin = "{}'s, by the VIN";
inline constexpr char const* listByGuess = "not known; perhaps {0}'s: --make \"{0}\"";
inline constexpr char const* noList = "not known; --make MAKER names the maker, -v lists all";

// Control module.
inline constexpr char const* verification = "{}  verification {}";
inline constexpr char const* engineNumber = "Engine number";
inline constexpr char const* typeApproval = "Type approval";
inline constexpr char const* withLamp = "With lamp on";
inline constexpr char const* sinceCleared = "Since cleared";
inline constexpr char const* engineRan = "engine ran {}";

// Monitors and their tests.
inline constexpr char const* ready = "ready";
inline constexpr char const* monitorNoun = "monitor";
inline constexpr char const* notComplete = "{} not complete";
inline constexpr char const* noMonitors = "no monitors in this module";
inline constexpr char const* notAvailable = "Not available: ";
inline constexpr char const* monitorTests = "Monitor tests";
inline constexpr char const* testsFailed = "{} failed";
inline constexpr char const* testsPassed = "{} passed";
inline constexpr char const* testsWithout = "{} without result";
inline constexpr char const* oxygenMonitor = "Oxygen monitor";
inline constexpr char const* oxygenSensors = "O2 sensors";
inline constexpr char const* oxygenTests = "O2 tests";
inline constexpr char const* oxygenComplete = "complete";
inline constexpr char const* oxygenNotComplete = "not complete, so results don't count yet";
inline constexpr char const* oxygenElsewhere = "among those of the monitors (velmora monitors)";
inline constexpr char const* noTests = "{}: no tests";
inline constexpr char const* counters = "Counters";
inline constexpr char const* counterNoun = "counter";
inline constexpr char const* aboveZero = "{} above 0";
inline constexpr char const* allZero = "all are 0";

// Routines.
inline constexpr char const* routines = "Routines";
inline constexpr char const* routine = "Routine {}";

// A VIN.
inline constexpr char const* region = "Region";
inline constexpr char const* country = "Country";
inline constexpr char const* checkDigit = "Check digit";
inline constexpr char const* noYear = "none coded in position 10 ({})";
inline constexpr char const* yearByPosition = "{} (position 10 is {}, position 7 says which cycle of 30 years)";
inline constexpr char const* yearPerhaps = "{}, if this maker codes it (position 10 is {})";
inline constexpr char const* checkRight = "right";
inline constexpr char const* checkWrong = "wrong: {} would fit; mistyped or altered";
inline constexpr char const* checkUnused = "not used by this maker or market";
inline constexpr char const* codesByDefault = "{}'s meanings, used by default";
inline constexpr char const* codesPerhaps = "perhaps {0}'s meanings: --make \"{0}\"";
inline constexpr char const* codesUnknown = "no list for this maker";

// Scans that were kept.
inline constexpr char const* nothingKept = "Nothing is kept yet; velmora scan --history keeps a scan";
inline constexpr char const* scanOf = "scan {} of {}";
inline constexpr char const* lampUnknown = "lamp -";
inline constexpr char const* lampOn = "lamp on";
inline constexpr char const* lampOff = "lamp off";
inline constexpr char const* noCodes = "no codes";
inline constexpr char const* better = "better";
inline constexpr char const* worse = "worse";

// A test's limits, behind its value.
inline constexpr char const* range = "({} to {})";

} // namespace velmora::texts::plain
