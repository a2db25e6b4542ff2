#pragma once

// All the words of a report that is handed over, so that they can be read, and one day translated, in one place.

namespace velmora::texts {

inline constexpr char const* title = "Vehicle report";
inline constexpr char const* made = "Date";
inline constexpr char const* vehicle = "Vehicle";
inline constexpr char const* vin = "VIN";
inline constexpr char const* maker = "Maker";
inline constexpr char const* modelYear = "Model year";
inline constexpr char const* adapter = "Adapter";
inline constexpr char const* device = "Device";
inline constexpr char const* description = "Description";
inline constexpr char const* identifier = "Identifier";
inline constexpr char const* voltage = "Voltage at the adapter";
inline constexpr char const* protocol = "Protocol";
inline constexpr char const* port = "Port";
inline constexpr char const* findings = "Findings";
inline constexpr char const* noFindings = "Nothing that is wrong was told.";
inline constexpr char const* module = "Control module";
inline constexpr char const* modules = "Control modules";
inline constexpr char const* standard = "Standard";
inline constexpr char const* calibration = "Calibration";
inline constexpr char const* verification = "Verification number";
inline constexpr char const* engineSerial = "Engine serial number";
inline constexpr char const* erotan = "Type approval number";
inline constexpr char const* sensors = "Live sensors";
inline constexpr char const* codes = "Trouble codes";
inline constexpr char const* lamp = "Malfunction indicator lamp";
inline constexpr char const* on = "on";
inline constexpr char const* off = "off";
inline constexpr char const* notTold = "not reported";
inline constexpr char const* confirmed = "Confirmed";
inline constexpr char const* pending = "Pending";
inline constexpr char const* permanent = "Permanent";
inline constexpr char const* noneStored = "none stored";
inline constexpr char const* refused = "refused";
inline constexpr char const* noAnswer = "no answer";
inline constexpr char const* cantBeRead = "the reply can't be read";
inline constexpr char const* kind = "Kind";
inline constexpr char const* code = "Code";
inline constexpr char const* make = "Maker";
inline constexpr char const* meaning = "Meaning";
inline constexpr char const* freezeFrame = "Freeze frame";
inline constexpr char const* sensor = "Sensor";
inline constexpr char const* value = "Value";
inline constexpr char const* unit = "Unit";
inline constexpr char const* readiness = "Readiness";
inline constexpr char const* monitor = "Monitor";
inline constexpr char const* sinceCleared = "Since codes were cleared";
inline constexpr char const* thisCycle = "This driving cycle";
inline constexpr char const* monitorTests = "Monitor test results";
inline constexpr char const* oxygenTests = "Oxygen sensor tests";
inline constexpr char const* result = "Result";
inline constexpr char const* test = "Test";
inline constexpr char const* minimum = "Minimum";
inline constexpr char const* maximum = "Maximum";
inline constexpr char const* counters = "In-use performance";
inline constexpr char const* counter = "Counter";
inline constexpr char const* allZero = "All counters are 0.";
inline constexpr char const* notAllTold = "{} (not all that the module supports is known: {})";
inline constexpr char const* program = "Velmora ";
inline constexpr char const* ratio = "Ratio";
inline constexpr char const* completed = "Completed";
inline constexpr char const* conditionsMet = "Conditions met";
inline constexpr char const* values = "Values while the report was made";
inline constexpr char const* suggested = "What the data suggests";
inline constexpr char const* lampShort = "Lamp";
inline constexpr char const* codeCount = "Stored codes";
inline constexpr char const* incompleteCount = "Monitors not complete";
inline constexpr char const* moduleCount = "Control modules";
inline constexpr char const* suggestionCount = "Worth a look";
inline constexpr char const* name = "Name";
inline constexpr char const* contents = "Contents";
inline constexpr char const* howRun = "Read with";
inline constexpr char const* inSection = "{} ({})";
inline constexpr char const* distanceWithLamp = "Distance with the lamp on";
inline constexpr char const* timeWithLamp = "Engine run time with the lamp on";
inline constexpr char const* distanceSinceCleared = "Distance since codes were cleared";
inline constexpr char const* timeSinceCleared = "Engine run time since codes were cleared";
inline constexpr char const* howRead = "How it was read";
inline constexpr char const* footer = "Read by OBD-II services of SAE J1979. What a module did not report is shown as "
                                      "\"-\" or \"not reported\"; it is not known "
                                      "to be in order. Made by Velmora ";

// Words in a sentence or a table cell.
inline constexpr char const* confirmedWord = "confirmed";
inline constexpr char const* pendingWord = "pending";
inline constexpr char const* permanentWord = "permanent";
// By the number of TopicAnswer, of ReadinessStatus and of LimitTest::Verdict.
inline constexpr char const* answers[] = {"read", "not supported", "no answer", "unreadable", "refused"};
inline constexpr char const* statuses[] = {"complete", "not complete", "disabled this cycle", "not available"};
inline constexpr char const* verdicts[] = {"failed", "passed", "no result", "constant"};
inline constexpr char const* bankSensor = "Bank {} sensor {}";
inline constexpr char const* meaningsOne = "maker-specific, {} meaning{}";
inline constexpr char const* meaningsMany = "maker-specific, {} meanings{}";
inline constexpr char const* ofOtherMakers = " of other makers";
inline constexpr char const* smallMaker = "a small maker";
inline constexpr char const* registeredIn = " registered in ";
inline constexpr char const* probably = "probably ";
inline constexpr char const* orYear = " or ";
inline constexpr char const* yearPerhaps = "{}, if this maker codes it";
inline constexpr char const* codesRead = "Trouble codes read";
inline constexpr char const* codesByOption = "with {}'s list, as chosen";
inline constexpr char const* codesByVin = "with {}'s list, by the VIN";
inline constexpr char const* codesByGuess = "with no maker's list; {}'s may fit: --make \"{}\"";

} // namespace velmora::texts
