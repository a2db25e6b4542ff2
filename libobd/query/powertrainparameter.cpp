#include <obd/powertrainparameter.h>

namespace obd {

void PowertrainParameter::header(std::vector<unsigned char>& data, int offset) const
{
    data = {static_cast<unsigned char>(static_cast<int>(m_mode) + offset), static_cast<unsigned char>(pid() & 0xFF)};
    if (m_mode == ObdMode::FreezeFrame) {
        data.push_back(m_frame);
    }
}

void PowertrainParameter::getRequestData(std::vector<unsigned char>& data) const
{
    header(data, 0);
}

void PowertrainParameter::getSignature(std::vector<unsigned char>& signature) const
{
    header(signature, 0x40);
}

bool PowertrainParameter::fromBytes(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data)
{
    if (data.size() <= headerLength()) {
        return false;
    }
    return fromPayload(ecu, {data.begin() + static_cast<std::ptrdiff_t>(headerLength()), data.end()});
}

} // namespace obd
