#pragma once

namespace velmora {

// What an event may be of, for outputs that have to name all of them beforehand.
inline constexpr char const* eventKinds[] = {
    "ignition_on",    "ignition_off",  "engine_start", "engine_stop", "asleep",      "awake",
    "adapter_asleep", "adapter_awake", "link_lost",    "link_back",   "lamp_on",     "lamp_off",
    "code_new",       "code_gone",     "ready",        "not_ready",   "voltage_low", "voltage_good",
    "clock_set",      "clock_unsure",  "trip",         "engine_run"};

} // namespace velmora
