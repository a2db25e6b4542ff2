#pragma once

#include "libvelmora/doctor/adaptertalk.h"
#include "libvelmora/doctor/doctorreport.h"

namespace velmora {

// The adapter itself, before the bus is opened: answer, prompt, echo, identity with its contradictions, and the voltage
// at the car's socket. Adds to the report. False if it does not answer.
bool checkAdapter(AdapterTalk& talk, DoctorReport& report);

// What a voltage at the socket says of battery and engine; nothing for a reply that is none.
std::optional<DoctorCheck> judgeVoltage(std::string const& reply);

// What the adapter's ignition pin says; nothing for a reply that is none.
std::optional<DoctorCheck> judgeIgnition(std::string const& reply);

// Each bus in turn, with the adapter's own words, for a vehicle that does not answer. Ends at the first that does.
void checkBuses(AdapterTalk& talk, DoctorReport& report);

} // namespace velmora
