#pragma once

// The words of what changed between two scans.

namespace velmora::texts::change {

inline constexpr char const* title = "Changes";
inline constexpr char const* none = "nothing that both scans told has changed";
inline constexpr char const* module = "control module";
inline constexpr char const* lamp = "lamp";
inline constexpr char const* code = "{} code";
inline constexpr char const* cleared = "codes cleared";
inline constexpr char const* clearedText = "between the two scans";
inline constexpr char const* readiness = "monitor";
inline constexpr char const* counter = "counter";
inline constexpr char const* software = "software";
inline constexpr char const* vin = "VIN";
inline constexpr char const* test = "test result";
inline constexpr char const* outside = "outside its limits";
inline constexpr char const* inside = "within its limits";
inline constexpr char const* present = "there";
inline constexpr char const* absent = "not there";
inline constexpr char const* withLimits = "{} ({} to {})";
inline constexpr char const* noLimit = "-";

} // namespace velmora::texts::change
