#pragma once

namespace velmora::cli {

class CommandLine;

// Adds every command of the program, in the order of its help.
void addCommands(CommandLine& commandLine);

// One function a command, each in the file of its name.
void addClearCommand(CommandLine& commandLine);
void addCodesCommand(CommandLine& commandLine);
void addConsoleCommand(CommandLine& commandLine);
void addCountersCommand(CommandLine& commandLine);
#ifdef VELMORA_DASH
void addDashCommand(CommandLine& commandLine);
#endif
void addDiffCommand(CommandLine& commandLine);
void addDoctorCommand(CommandLine& commandLine);
void addDtcCommand(CommandLine& commandLine);
void addFreezeCommand(CommandLine& commandLine);
void addHistoryCommand(CommandLine& commandLine);
void addInfoCommand(CommandLine& commandLine);
void addLiveCommand(CommandLine& commandLine);
void addLogCommand(CommandLine& commandLine);
void addModulesCommand(CommandLine& commandLine);
void addMonitorsCommand(CommandLine& commandLine);
void addOxygenCommand(CommandLine& commandLine);
void addPortsCommand(CommandLine& commandLine);
void addReadinessCommand(CommandLine& commandLine);
void addRecordCommand(CommandLine& commandLine);
void addRoutinesCommand(CommandLine& commandLine);
void addScanCommand(CommandLine& commandLine);
void addSensorsCommand(CommandLine& commandLine);
void addSettingsCommand(CommandLine& commandLine);
void addSignalsCommand(CommandLine& commandLine);
void addSimulateCommand(CommandLine& commandLine);
void addTripsCommand(CommandLine& commandLine);
void addVinCommand(CommandLine& commandLine);
void addWatchCommand(CommandLine& commandLine);

} // namespace velmora::cli
