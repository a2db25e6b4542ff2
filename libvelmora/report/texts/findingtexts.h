#pragma once

// The words of findings. What is worked out from data only "suggests": the data can't show a part or a person's doing.
// Braces are filled in by whoever uses the text.

namespace velmora::texts::finding {

// Short names, as they stand beside the module.
inline constexpr char const* lamp = "lamp";
inline constexpr char const* failedTest = "failed test";
inline constexpr char const* notComplete = "not complete";
inline constexpr char const* untold = "not reported";
inline constexpr char const* cleared = "codes cleared";
inline constexpr char const* permanentAlone = "permanent code alone";
inline constexpr char const* lampAlone = "lamp without code";
inline constexpr char const* nearLimit = "close to a limit";
inline constexpr char const* fuelTrim = "fuel trim";
inline constexpr char const* thermostat = "coolant not warm";
inline constexpr char const* coolantHot = "coolant hot";
inline constexpr char const* voltage = "voltage";
inline constexpr char const* misfires = "misfires counted";
inline constexpr char const* vinsDiffer = "VINs differ";
inline constexpr char const* noVerification = "no verification number";

inline constexpr char const* wholeVehicle = "vehicle";
inline constexpr char const* adapter = "adapter";
inline constexpr char const* because = "because";
inline constexpr char const* orElse = "it may also be";
inline constexpr char const* because1 = "Because";
inline constexpr char const* orElse1 = "It may also be";
inline constexpr char const* data = "data";
inline constexpr char const* note = "Note";
inline constexpr char const* warning = "Warning";
inline constexpr char const* bad = "Fault";

inline constexpr char const* lampOn = "the malfunction indicator is on";
inline constexpr char const* lampTopic = "lamp";
inline constexpr char const* confirmedTopic = "confirmed codes";
inline constexpr char const* joinAnd = " and ";
inline constexpr char const* supportsTopic = "all that it supports ({})";

// Codes cleared.
inline constexpr char const* clearedWithin = "suggests that codes were cleared within about {}";
inline constexpr char const* clearedLately = "suggests that codes were cleared not long ago";
inline constexpr char const* clearedStrongly = "strongly ";
inline constexpr char const* warmUps = "{} warm-ups of the engine since codes were cleared (5 or fewer are few)";
inline constexpr char const* distance = "{} driven since codes were cleared (80 km or less are few)";
inline constexpr char const* incomplete = "{} monitors are not complete: {}";
inline constexpr char const* permanentUnstored = "a permanent code stands and none is stored: {}";
inline constexpr char const* runTime = "the engine ran for {} since codes were cleared";
inline constexpr char const* noResults = "no monitor test has a result since codes were cleared";
inline constexpr char const* clearedByWork = "a battery or control module that was disconnected or replaced, or a "
                                             "software update";
inline constexpr char const* clearedByShop =
    "a workshop that cleared the codes after a repair, as is usual; a clear is "
    "no sign of a fault that is being hidden";
inline constexpr char const* clearedByTrips = "a new car, short trips only, or cold weather, which keeps some monitors "
                                              "from running";
inline constexpr char const* clearedHybrid = "a hybrid that seldom runs its engine";
inline constexpr char const* clearedDiesel = "a diesel, whose filter and NOx monitors need long trips";
inline constexpr char const* clearedZeros = "a module that does not keep these counts and always tells 0";
inline constexpr char const* permanentText = "suggests that codes were cleared, and that the module has not yet seen "
                                             "the repair hold";
inline constexpr char const* permanentElse = "a repair that is done, and a drive that is still to come: the module "
                                             "erases the code itself after it";

// Lamp without a code.
inline constexpr char const* lampAloneText = "the lamp is commanded on, and no module that commands it has a confirmed "
                                             "code";
inline constexpr char const* lampCommanded = "{} commands the lamp on and tells no confirmed code";
inline constexpr char const* lampAloneElse = "a reason outside of OBD, which the maker's own tool would show";
inline constexpr char const* lampAloneMoment = "a code that came or went while the report was made";

// Close to a limit.
inline constexpr char const* nearText = "passed, yet suggests that what is tested comes close to its limit: {}";
inline constexpr char const* nearTests = "{} results";
inline constexpr char const* nearTest = "one result";
inline constexpr char const* nearMin = "{}, {}: {} with a minimum of {}";
inline constexpr char const* nearMax = "{}, {}: {} with a maximum of {}";
inline constexpr char const* nearElse = "a test that lies there in a sound car of this make, too; only a trend over "
                                        "several scans tells more";

// Fuel trim.
inline constexpr char const* trimAdds =
    "the module adds {} % of fuel on bank {}, {}; suggests that the mixture is leaner "
    "than the module reckons";
inline constexpr char const* trimTakes =
    "the module takes {} % of fuel away on bank {}, {}; suggests that the mixture is "
    "richer than the module reckons";
inline constexpr char const* trimFar = "far off";
inline constexpr char const* trimAway = "away from the middle";
inline constexpr char const* trimSum = "short and long term trim together, at each of {} readings, in closed loop";
inline constexpr char const* trimWarm = "coolant at {}";
inline constexpr char const* trimBoth =
    "both banks lie to the same side, which suggests a common cause, such as air or "
    "fuel pressure";
inline constexpr char const* trimElse = "another fuel (ethanol), a purge of the fuel vapour, or a moment of the drive; "
                                        "makers' own limits differ";

// Temperature.
inline constexpr char const* coldText =
    "suggests that the engine does not come to its temperature, as with a thermostat "
    "that stays open";
inline constexpr char const* coolantAt = "coolant at {} at the most";
inline constexpr char const* ranFor = "the engine has run for {}";
inline constexpr char const* ambientAt = "{} outside";
inline constexpr char const* coldElse =
    "idling or a downhill drive in cold weather, or a hybrid whose engine ran seldom";
inline constexpr char const* ambientUntold =
    "weather colder than -7 \u00B0C: the vehicle does not tell the temperature "
    "outside";
inline constexpr char const* hotText = "the coolant is hotter than 115 \u00B0C";
inline constexpr char const* hotElse = "a hard drive, or a fan that was just about to start";

// Voltage.
inline constexpr char const* lowRunning = "suggests that the battery is not being charged";
inline constexpr char const* highRunning = "suggests that the charging voltage is not being held back";
inline constexpr char const* lowStanding = "suggests that the battery is weak";
inline constexpr char const* voltsModule = "{} V by the module, at each of {} readings";
inline constexpr char const* voltsAdapter = "{:.1f} V by the adapter, which is off by up to half a volt";
inline constexpr char const* engineRuns = "the engine runs";
inline constexpr char const* engineStands = "the engine stands";
inline constexpr char const* chargeElse = "smart charging, which runs anywhere between 12.2 and 15 V";
inline constexpr char const* standElse = "lights and fan that were on for a while with the ignition";

// Misfires.
inline constexpr char const* misfireText = "misfires were counted; below the limit they are no fault";
inline constexpr char const* misfireCount = "{}, {}: {}";
inline constexpr char const* misfireElse = "single misfires at a cold start or on a rough road, which every engine has";

// Numbers of modules.
inline constexpr char const* vinText = "suggests that a module came from another vehicle, or holds another's number";
inline constexpr char const* vinOf = "{} tells {}";
inline constexpr char const* vinElse = "a used part, or a module that was programmed with a wrong number";
inline constexpr char const* verificationText = "a calibration without the number that would prove it unchanged";
inline constexpr char const* verificationOf = "calibration {}: {}";
inline constexpr char const* verificationNone = "no verification number";
inline constexpr char const* verificationElse = "a module that works the number out only after minutes, or one from "
                                                "before the number was asked for";

} // namespace velmora::texts::finding
