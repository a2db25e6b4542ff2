#pragma once

#include "libobd/parameters/fixedrequestparameter.h"

#include <map>
#include <memory>
#include <vector>

namespace obd {

// Asks for one range of 32 identifiers of a service. A reply's 4 mask bytes tell which of them a module supports; the
// last bit tells whether a next range exists (SAE J1979).
class SupportedOids : public FixedRequestParameter
{
public:
    unsigned int timeout() const override; // 3500 ms: every module may answer
    void clear() override;

    // Bytes of the reply that stand before the mask.
    virtual unsigned int payloadOffset(std::shared_ptr<IEcu> const& ecu,
                                       std::vector<unsigned char> const& data) const = 0;

    // The modules that answered, in rising order of id.
    std::vector<unsigned int> ecuIds() const;

    // What a module supports of this range, as numbers from 1 to 32 counted from its first; empty without an answer.
    std::vector<unsigned char> oids(IEcu const& ecu) const;

protected:
    using FixedRequestParameter::FixedRequestParameter;

    bool fromBytes(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data) override;

private:
    std::map<unsigned int, std::vector<unsigned char>> m_oids; // by module id
};

class Service01Oids : public SupportedOids
{
public:
    explicit Service01Oids(unsigned char first);
    // 11000 ms for the first range: it is the first request of a connection, and the adapter may have to start the bus.
    unsigned int timeout() const override;
    unsigned int payloadOffset(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data) const override;

private:
    unsigned char m_first;
};

class Service02Oids : public SupportedOids
{
public:
    Service02Oids(unsigned char first, unsigned char frame);
    unsigned int payloadOffset(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data) const override;
};

class Service05Oids : public SupportedOids
{
public:
    // sensor: see oxygenSensorByte.
    Service05Oids(unsigned char first, unsigned char sensor);
    unsigned int payloadOffset(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data) const override;
};

// On the buses other than CAN the replies of services 06, 08 and 09 carry a filler byte before the mask.
class Service06Oids : public SupportedOids
{
public:
    explicit Service06Oids(unsigned char first);
    unsigned int payloadOffset(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data) const override;
};

class Service08Oids : public SupportedOids
{
public:
    // The request's length is fixed on the buses other than CAN, so it is filled up there.
    Service08Oids(unsigned char first, ObdProtocol protocol);
    unsigned int payloadOffset(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data) const override;
};

class Service09Oids : public SupportedOids
{
public:
    explicit Service09Oids(unsigned char first);
    unsigned int payloadOffset(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data) const override;
};

} // namespace obd
