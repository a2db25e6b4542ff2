#include "libvelmora/performance/powermodel.h"

#include <obd/nack.h>
#include <obd/parameterfactory.h>
#include <obd/sensorvalue.h>

#include <map>
#include <utility>

namespace velmora {

namespace {

constexpr std::chrono::milliseconds modelStep{500};
constexpr unsigned char replyOfLiveData = obd::positiveReply(obd::ObdMode::CurrentData);
constexpr unsigned char speedPid = 0x0D;
constexpr unsigned char engineSpeedPid = 0x0C;

bool isReply(Reading const& reading, unsigned char pid, std::size_t bytes)
{
    return reading.raw.size() >= 2 + bytes && reading.raw[0] == replyOfLiveData && reading.raw[1] == pid;
}

std::optional<double> numberOfFirst(obd::PowertrainParameter& parameter, obd::IEcu const& ecu)
{
    auto const values = parameter.values(ecu, obd::UnitSystem::Metric);
    return values.empty() ? std::nullopt : values.front()->number();
}

} // namespace

// Answers from what was read, and asks nobody.
class PowerModel::Held : public obd::IObdProxy
{
public:
    explicit Held(std::shared_ptr<obd::IEcu> ecu) : m_ecu(std::move(ecu)) {}

    void hold(unsigned char pid, std::vector<unsigned char> const& payload) { m_payloads[pid] = payload; }
    bool isWhole() const { return m_payloads.contains(speedPid) && m_payloads.contains(engineSpeedPid); }
    double rpm() const
    {
        std::vector<unsigned char> const& payload = m_payloads.at(engineSpeedPid);
        return (payload[2] * 256 + payload[3]) / 4.0;
    }

    void setDevice(std::shared_ptr<obd::IDevice> /*device*/) override {}
    bool initialize() override { return false; }
    bool isConnected() override { return true; }
    obd::ObdProtocol protocol() override { return {}; }
    std::vector<std::shared_ptr<obd::IEcu>> ecus() override { return {m_ecu}; }
    std::shared_ptr<obd::IEcu> firstEcu() override { return m_ecu; }
    std::shared_ptr<obd::IEcu> ecu(unsigned int id) override { return id == m_ecu->id() ? m_ecu : nullptr; }
    obd::IDevice::Status execute(std::string const& /*command*/, std::string& /*response*/,
                                 unsigned int /*timeoutMs*/) override
    {
        return obd::IDevice::Status::Unparsed;
    }
    obd::IDevice::Status execute(std::vector<unsigned char> const& request, obd::ResponseMap& responses,
                                 unsigned int /*timeoutMs*/) override
    {
        auto const found = request.size() == 2 ? m_payloads.find(request[1]) : m_payloads.end();
        if (found == m_payloads.end()) {
            return obd::IDevice::Status::Unparsed;
        }
        responses[m_ecu->id()] = found->second;
        return obd::IDevice::Status::Ok;
    }
    float batteryVoltage() override { return 0.0F; }

private:
    std::shared_ptr<obd::IEcu> const m_ecu;
    std::map<unsigned char, std::vector<unsigned char>> m_payloads; // by PID
};

PowerModel::PowerModel(std::shared_ptr<obd::IEcu> ecu, obd::IVelmoraSettings const& settings)
    : m_ecu(std::move(ecu)), m_held(std::make_shared<Held>(m_ecu)),
      m_power(obd::ParameterFactory().createParameter(*m_ecu, settings, obd::ParameterIdentifier::EnginePower)),
      m_torque(obd::ParameterFactory().createParameter(*m_ecu, settings, obd::ParameterIdentifier::Torque))
{
    if (m_power != nullptr && m_torque != nullptr) {
        m_power->clear();
        m_torque->clear();
    }
}

PowerModel::~PowerModel() = default;

std::optional<PowerModel::Output> PowerModel::take(Reading const& reading)
{
    bool const isSpeed = isReply(reading, speedPid, 1);
    if (!isSpeed && !isReply(reading, engineSpeedPid, 2)) {
        return std::nullopt;
    }
    m_held->hold(reading.raw[1], reading.raw);
    if (!isSpeed || !m_held->isWhole() || m_torque == nullptr || m_power == nullptr ||
        reading.time - m_lastUpdate < modelStep) {
        return std::nullopt;
    }
    m_lastUpdate = reading.time;
    if (m_torque->update(m_held) != obd::IQuery::UpdateStatus::UpdateOk) {
        return std::nullopt;
    }
    std::optional<double> const power = numberOfFirst(*m_power, *m_ecu);
    std::optional<double> const torque = numberOfFirst(*m_torque, *m_ecu);
    return power && torque ? std::optional(Output{m_held->rpm(), *power, *torque}) : std::nullopt;
}

std::optional<double> speedIn(Reading const& reading)
{
    return isReply(reading, speedPid, 1) ? std::optional<double>(reading.raw[2]) : std::nullopt;
}

std::optional<double> engineSpeedIn(Reading const& reading)
{
    return isReply(reading, engineSpeedPid, 2) ? std::optional((reading.raw[2] * 256 + reading.raw[3]) / 4.0)
                                               : std::nullopt;
}

} // namespace velmora
