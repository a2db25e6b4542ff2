#pragma once

#include "simulator/bytes.h"
#include "simulator/car/drivemodel.h"

namespace obdsim {

/// The memory of a module that the clearing of codes resets.
struct SinceCleared
{
    double seconds = 0;
    double kilometres = 0;
    double warmUps = 0;
    double lampSeconds = 0; ///< driven with the lamp on
    double lampKilometres = 0;
};

/// True if the drive model feeds that mode 01 PID.
bool isLivePid(std::uint8_t pid);

/// Data bytes of a mode 01 PID by SAE J1979; values beyond the range of the PID
/// are cut to it. Nothing for a PID that the model does not feed.
std::optional<Bytes> livePid(std::uint8_t pid, DriveState const& drive, SinceCleared const& cleared);

} // namespace obdsim
