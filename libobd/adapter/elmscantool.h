#pragma once

#include "libobd/adapter/adapterversion.h"
#include "libobd/adapter/elmfamily.h"
#include "libobd/adapter/proxyerror.h"

#include <obd/idataconnection.h>
#include <obd/idevice.h>

#include <atomic>
#include <initializer_list>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <vector>

namespace obd {

// A line rate in baud, such as 38400.
using BaudRate = unsigned int;

// The driver of an ELM327-family adapter. One instance serves one connection:
//   created -> initialize -> initialised -> detectVehicle -> enabled -> close, or a dead connection -> disabled
// A disabled one sends nothing more; initialize takes it up again. One thread at a time may talk through it, and close
// may cut in; the state and the texts may be read from any thread.
//
// The members stand in several files: elmscantool_transport.cpp (commands and replies), elmscantool_bringup.cpp
// (identity and configuration), elmscantool_protocol.cpp (finding the vehicle's bus), elmscantool_baudrate.cpp (change
// of the line rate), elmscantool.cpp (all else).
class ElmScantool : public IDevice
{
public:
    using ProxyError = obd::ProxyError;

    // From here on replies end at the prompt. The connection must not be null.
    explicit ElmScantool(std::shared_ptr<IDataConnection> connection);

    std::string device() override;
    std::string description() override;
    std::string identification() override;
    bool batteryVoltage(float& volts) override;
    ObdProtocol getProtocol() override;
    std::string getProtocolDescription() override;

    bool initialize() override;
    bool detectVehicle(VehicleProtocol protocol) override;
    void close() override;
    bool isEnabled() const override;
    Status execute(std::string const& command, std::string& response, unsigned int timeoutMs) override;
    Status execute(std::vector<unsigned char> const& payload, ResponseMap& responses, unsigned int timeoutMs) override;
    bool activateEcu(unsigned int ecu) override;
    VehicleProtocol vehicleProtocol() override;
    AdapterNote lastNote() override;

    // Asks the adapter for its name. False if it gives none.
    bool identifyInterface();
    // Drops what is under way and restarts the adapter. False if it doesn't say its name afterwards.
    bool resetInterface();
    // Puts the adapter's settings back to the factory's.
    bool restoreDefaults();
    // Whether an adapter answers at all, in two attempts.
    bool testConnectivity();
    // How long the adapter waits for the vehicle's replies, up to 1020 ms in steps of 4.
    bool setTimeout(unsigned int ms);
    // Whether the adapter shows the headers of the vehicle's frames, which the byte form of execute depends on.
    bool turnHeadersOn();
    bool turnHeadersOff();
    // Shows the CAN data length in front of a frame's data. The byte form of execute can't read that.
    bool displayDlc();

    // A change of the line rate, only while nothing else talks: setBaudRateSetTimeout (optional) tells how long the
    // adapter waits for the host, up to 1275 ms; after changeBaudRate the application switches its port to the new rate
    // within that time and calls handleBaudRateChange, which confirms it. If that fails, host and adapter may disagree,
    // and the application is to go back to the old rate.
    bool setBaudRateSetTimeout(unsigned int ms);
    bool changeBaudRate(BaudRate rate);
    bool handleBaudRateChange();

private:
    bool sendPayload(std::vector<unsigned char> const& payload);
    bool receivePayload(std::vector<unsigned char>& data, unsigned int timeoutMs);
    bool sendString(std::string const& text);
    // Empty if no reply came, or one with the adapter's error message.
    std::string receiveString(unsigned int timeoutMs);
    // All that comes in several reads, one after the other.
    std::string receiveStrings(std::initializer_list<unsigned int> timeoutsMs);
    bool request(std::string const& text, std::string& response, unsigned int timeoutMs);
    // Sends a command and reads its reply twice, since an adapter may send more than one piece. Nothing if the command
    // could not be sent.
    std::optional<std::string> ask(std::string const& command);
    bool executeCommonQuery(std::string const& command, std::string const& expected, std::string const& errorText);
    Status noReplyStatus() const;

    bool parseInterface(std::string raw);
    bool updateDeviceDescription();
    bool updateDeviceIdentifier();
    bool configure();
    bool reset();
    void quickReset();
    bool setEchoOff();
    bool setLinefeedOff();
    bool setSpacesOff();
    bool setMemoryOff();
    bool areHeadersOn() const;

    bool setupProtocol(VehicleProtocol protocol);
    bool searchProtocols();
    bool configureProtocol(VehicleProtocol protocol);
    bool tryProtocol(VehicleProtocol protocol);
    bool setProtocol(VehicleProtocol protocol);
    bool setEchoedProtocol(std::string const& command, std::string const& expected);
    bool identifyProtocol();
    bool queryProtocolNumber();
    bool queryProtocolDescription();

    bool setCanFilter(unsigned int ecu);
    bool setCanMask(unsigned int ecu);

    std::string changeBaudRateCommand(BaudRate rate);
    BaudRateDialogue baudRateDialogue();

    void enterLowPowerMode();
    void setDisabled();

    template <typename T>
    T trait(T ElmFamily::*which)
    {
        return familyTrait(device(), which);
    }
    std::string familyCommand(std::string_view ElmFamily::*which) { return std::string(trait(which)); }

    std::string guarded(std::string const& text) const;
    void store(std::string& text, std::string value);

    std::shared_ptr<IDataConnection> m_connection;
    std::atomic<bool> m_enabled{false};
    // Guards the texts; never held over a call out.
    mutable std::mutex m_textMutex;
    std::string m_device;
    std::string m_description;
    std::string m_identification;
    std::string m_protocolDescription;
    std::atomic<AdapterVersion> m_version{AdapterVersion{}};
    std::atomic<VehicleProtocol> m_protocol{VehicleProtocol::Automatic};
    std::atomic<bool> m_headersOn{false};
    std::atomic<bool> m_disabled{false};
    std::atomic<AdapterNote> m_note{AdapterNote::None};
};

} // namespace obd
