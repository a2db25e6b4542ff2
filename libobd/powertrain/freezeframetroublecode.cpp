#include "libobd/powertrain/freezeframetroublecode.h"

#include "libobd/catalogue/dtcreader.h"
#include "libobd/parameters/dtcparameter.h"
#include "libobd/parameters/replychecks.h"

#include <obd/sensorvalue.h>

namespace obd {
namespace {

constexpr auto ownPid = static_cast<ParameterIdentifier::Id>(0x02);

} // namespace

FreezeFrameTroubleCode::FreezeFrameTroubleCode(unsigned char frame)
    : PowertrainParameter(ObdMode::FreezeFrame, frame),
      m_info(std::make_shared<SensorInfo>(Pid2Uid(ownPid, 0), "Freeze Frame Trouble Code", false))
{}

void FreezeFrameTroubleCode::clear()
{
    m_codes.clear();
    PowertrainParameter::clear();
}

ParameterIdentifier::Id FreezeFrameTroubleCode::pid() const
{
    return ownPid;
}

std::string FreezeFrameTroubleCode::description(IEcu const& /*ecu*/)
{
    return m_info->description();
}

std::vector<std::shared_ptr<SensorInfo const>> FreezeFrameTroubleCode::sensorInfo(IEcu const& /*ecu*/)
{
    return {m_info};
}

std::vector<std::shared_ptr<SensorValue>> FreezeFrameTroubleCode::values(IEcu const& ecu, UnitSystem /*system*/)
{
    std::shared_ptr<DtcDataModel> const code = getTroubleCode(ecu);
    if (code == nullptr) {
        return {};
    }
    return {std::make_shared<TextualSensorValue>(m_info->uid(), code->code)};
}

std::shared_ptr<DtcDataModel> FreezeFrameTroubleCode::getTroubleCode(IEcu const& ecu) const
{
    return findOrEmpty(m_codes, ecu);
}

bool FreezeFrameTroubleCode::fromPayload(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& payload)
{
    m_codes.erase(ecu->id());
    if (payload.size() < 2) {
        return false;
    }
    std::string const code = dtcToString(payload);
    if (!code.empty()) {
        m_codes[ecu->id()] = DtcReader().getGenericCode(code);
    }
    return true;
}

} // namespace obd
