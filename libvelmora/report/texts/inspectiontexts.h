#pragma once

// The words of what a report says of an emissions inspection: what it suggests, by which rule and of which date. It
// never promises a result.

namespace velmora::texts::inspection {

inline constexpr char const* title = "Emissions inspection";
inline constexpr char const* ruleLabel = "Rule";
inline constexpr char const* verdictLabel = "Suggests";
inline constexpr char const* yearLabel = "Model year";
inline constexpr char const* dateLabel = "As of";
inline constexpr char const* reasonLabel = "Because";
inline constexpr char const* noteLabel = "Note";

// By the number of InspectionReport::Verdict.
inline constexpr char const* verdicts[] = {"nothing for sure", "ready for the OBD part of the inspection",
                                           "not ready for the OBD part of the inspection"};

inline constexpr char const* yearByOption = "{}, as given";
inline constexpr char const* yearByVin = "{}, by the VIN";
inline constexpr char const* yearMissing =
    "the rule goes by the model year, which neither the VIN nor an option tells: "
    "--model-year YEAR";
inline constexpr char const* tooOld = "the rule begins with model year {}";
inline constexpr char const* untoldReadiness = "no module told which monitors have run";
inline constexpr char const* untoldLamp = "no module told whether the lamp is commanded on";
inline constexpr char const* untoldCodes = "{} did not tell its confirmed codes";
inline constexpr char const* lampOn = "the lamp is commanded on";
inline constexpr char const* lampOff = "the lamp is not commanded on";
inline constexpr char const* stored = "{} confirmed codes: {}";
inline constexpr char const* permanent = "{} permanent codes: {}";
inline constexpr char const* noneIncomplete = "all monitors that count have run";
inline constexpr char const* incomplete = "not complete: {}";
inline constexpr char const* allowedCount = "for this model year up to {} may be incomplete";
inline constexpr char const* allowedNone = "for this model year none may be incomplete";
inline constexpr char const* allowedNames = "for this model year only these may be incomplete: {}";
inline constexpr char const* readinessFree = "which monitors have run does not count";
inline constexpr char const* dieselUntold = "what the rule says of diesels before model year {} is not known here";

inline constexpr char const* usEpa = "US EPA guidance for OBD inspections";
inline constexpr char const* usEpaDate = "June 2001 (EPA 420-R-01-015; 66 FR 18155 of 5 April 2001)";
inline constexpr char const* usEpaNote =
    "The three monitors that run all the time are not counted. Many states want the "
    "catalyst monitor complete at a retest after a catalyst code. States differ.";
inline constexpr char const* california = "California Smog Check, OBD test (BAR-OIS)";
inline constexpr char const* californiaDate =
    "BAR OBD test reference, since 2015; 16 CCR 3340.42.2(c), since 1 January "
    "2013; permanent codes since 1 July 2019";
inline constexpr char const* californiaNote = "Permanent codes count from model year 2010 on. The station also looks "
                                              "whether the lamp lights with the ignition, which is not judged here.";
inline constexpr char const* ukMot = "United Kingdom MOT test, engine lamp";
inline constexpr char const* ukMotDate = "MOT inspection manual, since 20 May 2018";
inline constexpr char const* ukMotNote =
    "Petrol cars first used from 1 July 2003 on, diesels from 1 July 2008 on: a lamp "
    "that shows a fault is a major defect. The tester looks at the lamp itself and "
    "measures the exhaust.";
inline constexpr char const* deAu = "Germany, Abgasuntersuchung (AU)";
inline constexpr char const* deAuDate =
    "two-stage test, as described in 2014; the tailpipe is always measured since 2018";
inline constexpr char const* deAuNote =
    "Lamp and stored codes are read. A monitor that is not complete is no failure: the "
    "exhaust is measured. No result can be suggested from the codes alone.";
inline constexpr char const* rulesChange = "Rules change; ask the station.";

} // namespace velmora::texts::inspection
