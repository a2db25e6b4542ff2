#include "program/command/commands.h"

namespace velmora::cli {

void addCommands(CommandLine& commandLine)
{
    addScanCommand(commandLine);
    addLiveCommand(commandLine);
    addSensorsCommand(commandLine);
    addCodesCommand(commandLine);
    addClearCommand(commandLine);
    addFreezeCommand(commandLine);
    addReadinessCommand(commandLine);
    addMonitorsCommand(commandLine);
    addOxygenCommand(commandLine);
    addCountersCommand(commandLine);
    addInfoCommand(commandLine);
    addRoutinesCommand(commandLine);
    addDoctorCommand(commandLine);
#ifdef VELMORA_HISTORY
    addHistoryCommand(commandLine);
    addDiffCommand(commandLine);
#endif
    addDtcCommand(commandLine);
    addVinCommand(commandLine);
    addConsoleCommand(commandLine);
    addLogCommand(commandLine);
    addRecordCommand(commandLine);
    addWatchCommand(commandLine);
#ifdef VELMORA_DASH
    addDashCommand(commandLine);
#endif
    addTripsCommand(commandLine);
    addSettingsCommand(commandLine);
    addSignalsCommand(commandLine);
    addModulesCommand(commandLine);
    addSimulateCommand(commandLine);
    addPortsCommand(commandLine);
}

} // namespace velmora::cli
