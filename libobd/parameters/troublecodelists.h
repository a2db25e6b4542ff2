#pragma once

#include "libobd/parameters/dtcparameter.h"

namespace obd {

// The codes that a module has confirmed (service 03); they light the malfunction indicator.
class ConfirmedTroubleCodes : public DtcParameter
{
public:
    ConfirmedTroubleCodes() : DtcParameter(0x03) {}
};

// The codes that a module found in this driving cycle or the last and has yet to confirm (service 07).
class PendingTroubleCodes : public DtcParameter
{
public:
    PendingTroubleCodes() : DtcParameter(0x07) {}
};

// The codes that stay until the module itself has seen the repair (service 0A).
class PermanentTroubleCodes : public DtcParameter
{
public:
    PermanentTroubleCodes() : DtcParameter(0x0A) {}
};

} // namespace obd
