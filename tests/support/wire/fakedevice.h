#pragma once

#include <obd/idevice.h>

#include <atomic>
#include <functional>
#include <map>
#include <string>
#include <vector>

namespace support {

using Bytes = std::vector<unsigned char>;

// An adapter with a vehicle link that answers requests from a table; a request that it does not know gets NoResponse.
class FakeDevice : public obd::IDevice
{
public:
    struct Answer
    {
        Status status = Status::Ok;
        obd::ResponseMap responses;
    };

    // The reply of one module; repeat the call for the reply of another to the same request.
    FakeDevice& answer(Bytes const& request, unsigned int module, Bytes const& reply)
    {
        m_answers[request].responses[module] = reply;
        return *this;
    }
    FakeDevice& answer(Bytes const& request, Answer const& all)
    {
        m_answers[request] = all;
        return *this;
    }

    // Runs before each request is answered.
    std::function<void(Bytes const& request)> onRequest = [](Bytes const&) {};

    std::vector<Bytes> requests;        // in their order
    std::vector<unsigned int> timeouts; // of the requests
    std::atomic<bool> enabled{true};
    obd::ObdProtocol busFamily = obd::ObdProtocolCan11;
    obd::VehicleProtocol busNumber = obd::VehicleProtocol::Iso15765Can11Bit500;
    obd::AdapterNote note = obd::AdapterNote::None;
    float volts = 12.5F;
    bool voltsRead = true;
    std::string lastCommand;

    std::string device() override { return "ELM327 v1.5"; }
    std::string description() override { return "fake"; }
    std::string identification() override { return {}; }
    bool batteryVoltage(float& out) override
    {
        if (voltsRead) {
            out = volts;
        }
        return voltsRead;
    }
    obd::ObdProtocol getProtocol() override { return busFamily; }
    std::string getProtocolDescription() override { return "ISO 15765-4 (CAN 11/500)"; }
    bool initialize() override { return true; }
    bool detectVehicle(obd::VehicleProtocol /*protocol*/) override { return true; }
    void close() override { enabled = false; }
    bool isEnabled() const override { return enabled; }
    Status execute(std::string const& command, std::string& response, unsigned int /*timeoutMs*/) override
    {
        lastCommand = command;
        response = "OK";
        return Status::Ok;
    }
    Status execute(Bytes const& payload, obd::ResponseMap& responses, unsigned int timeoutMs) override
    {
        requests.push_back(payload);
        timeouts.push_back(timeoutMs);
        onRequest(payload);
        auto const found = m_answers.find(payload);
        if (found == m_answers.end()) {
            return Status::NoResponse;
        }
        for (auto const& [id, data] : found->second.responses) {
            responses[id] = data;
        }
        return found->second.status;
    }
    bool activateEcu(unsigned int /*ecu*/) override { return false; }
    obd::VehicleProtocol vehicleProtocol() override { return busNumber; }
    obd::AdapterNote lastNote() override { return note; }

private:
    std::map<Bytes, Answer> m_answers;
};

} // namespace support
