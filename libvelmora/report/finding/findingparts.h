#pragma once

#include "libvelmora/report/finding/findings.h"

#include <optional>
#include <string>
#include <vector>

// What the single findings are made with and of.

namespace velmora {

// "7E8 ECM"
std::string nameOf(ModuleReport const& module);

// The value of a PID's sensor; null if the module did not tell it.
LiveValue const* findValue(ModuleReport const& module, unsigned int pid, int part = 0);
// Its last sample.
std::optional<double> numberOf(ModuleReport const& module, unsigned int pid, int part = 0);
// "87 °C"; "-" if it was not told.
std::string shownValue(ModuleReport const& module, unsigned int pid);

// The codes of one kind; null if the module did not tell the list.
CodeList const* readList(ModuleReport const& module, CodeKind kind);

// Whether the monitor of that name watches all the time, so that it is left out where monitors are counted.
bool isContinuous(std::string const& monitor);
// Whether the module has monitors that only a diesel has.
bool hasDieselMonitors(ModuleReport const& module);
// The names of the supported monitors that run now and then and have not since the codes were cleared.
std::vector<std::string> incompleteMonitors(ModuleReport const& module);
// Nothing if the module has no monitor of that name, or did not tell.
std::optional<bool> isIncomplete(ModuleReport const& module, std::string const& monitor);

// Each adds the findings of one subject.
void addClearedCodes(std::vector<Finding>& list, VehicleReport const& report);
void addLampsWithoutCode(std::vector<Finding>& list, VehicleReport const& report);
void addNearLimits(std::vector<Finding>& list, VehicleReport const& report);
void addMisfires(std::vector<Finding>& list, VehicleReport const& report);
void addFuelTrims(std::vector<Finding>& list, VehicleReport const& report);
void addTemperatures(std::vector<Finding>& list, VehicleReport const& report);
void addVoltages(std::vector<Finding>& list, VehicleReport const& report);
void addDifferingVins(std::vector<Finding>& list, VehicleReport const& report);
void addMissingVerification(std::vector<Finding>& list, VehicleReport const& report);

} // namespace velmora
