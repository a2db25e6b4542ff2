#include "libobd/parameters/supportedoids.h"

#include "libobd/bytes/bytes.h"

#include <common/logrecord.h>
#include <obd/protocolfamily.h>

#include <utility>

namespace obd {
namespace {

constexpr unsigned int maskLength = 4;

// A wrong filler is told, and the reply used all the same: real modules put anything there.
unsigned int offsetWithFiller(IEcu const& ecu, std::vector<unsigned char> const& data, unsigned char filler)
{
    if (isCan(ecu.protocol())) {
        return 2;
    }
    if (data.size() >= 3 && data[2] != filler) {
        TERVEX_LOG(Error) << "Invalid filler byte: " << static_cast<unsigned int>(data[2]);
    }
    return 3;
}

} // namespace

unsigned int SupportedOids::timeout() const
{
    return 3500;
}

void SupportedOids::clear()
{
    m_oids.clear();
}

std::vector<unsigned int> SupportedOids::ecuIds() const
{
    std::vector<unsigned int> ids;
    for (auto const& entry : m_oids) {
        ids.push_back(entry.first);
    }
    return ids;
}

std::vector<unsigned char> SupportedOids::oids(IEcu const& ecu) const
{
    auto const found = m_oids.find(ecu.id());
    return found != m_oids.end() ? found->second : std::vector<unsigned char>{};
}

bool SupportedOids::fromBytes(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data)
{
    unsigned int const offset = payloadOffset(ecu, data);
    if (data.size() < offset + maskLength) {
        return false;
    }
    unsigned int const mask = readUint32(data, offset);
    std::vector<unsigned char> supported;
    for (unsigned int i = 1; i <= 32; ++i) {
        if ((mask >> (32U - i) & 1U) != 0) {
            supported.push_back(static_cast<unsigned char>(i));
        }
    }
    m_oids[ecu->id()] = std::move(supported);
    return true;
}

Service01Oids::Service01Oids(unsigned char first) : SupportedOids({0x01, first}), m_first(first) {}

unsigned int Service01Oids::timeout() const
{
    return m_first == 0 ? 11000 : SupportedOids::timeout();
}

unsigned int Service01Oids::payloadOffset(std::shared_ptr<IEcu> const& /*ecu*/,
                                          std::vector<unsigned char> const& /*data*/) const
{
    return 2;
}

Service02Oids::Service02Oids(unsigned char first, unsigned char frame) : SupportedOids({0x02, first, frame}) {}

unsigned int Service02Oids::payloadOffset(std::shared_ptr<IEcu> const& /*ecu*/,
                                          std::vector<unsigned char> const& /*data*/) const
{
    return 3;
}

Service05Oids::Service05Oids(unsigned char first, unsigned char sensor) : SupportedOids({0x05, first, sensor}) {}

unsigned int Service05Oids::payloadOffset(std::shared_ptr<IEcu> const& /*ecu*/,
                                          std::vector<unsigned char> const& /*data*/) const
{
    return 3;
}

Service06Oids::Service06Oids(unsigned char first) : SupportedOids({0x06, first}) {}

unsigned int Service06Oids::payloadOffset(std::shared_ptr<IEcu> const& ecu,
                                          std::vector<unsigned char> const& data) const
{
    return offsetWithFiller(*ecu, data, 0xFF);
}

Service08Oids::Service08Oids(unsigned char first, ObdProtocol protocol)
    : SupportedOids({0x08, first}, requestFillers(protocol))
{}

unsigned int Service08Oids::payloadOffset(std::shared_ptr<IEcu> const& ecu,
                                          std::vector<unsigned char> const& data) const
{
    return offsetWithFiller(*ecu, data, 0x00);
}

Service09Oids::Service09Oids(unsigned char first) : SupportedOids({0x09, first}) {}

unsigned int Service09Oids::payloadOffset(std::shared_ptr<IEcu> const& ecu,
                                          std::vector<unsigned char> const& /*data*/) const
{
    return isCan(ecu->protocol()) ? 2 : 3;
}

} // namespace obd
