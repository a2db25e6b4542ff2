#include "libvelmora/session/openingfailure.h"

#include <variant>

namespace velmora::openingfailure {

Error silentAdapter(std::string const& port, std::optional<PortAddress> const& address, OpeningWatch const& seen)
{
    if (!seen.identification().empty()) {
        std::string const silentTo = seen.unanswered().empty() ? "what followed" : seen.unanswered();
        return {ErrorKind::AdapterSilent,
                seen.identification() + " answered on " + port + ", but not to " + silentTo + " in time",
                {"try again; a bad link loses answers now and then",
                 "pull the adapter and plug it in again, or try --reset"}};
    }
    std::vector<std::string> hints = {"is it the right port?"};
    if (address && std::holds_alternative<SerialAddress>(*address)) {
        hints.emplace_back("a serial adapter may use another line rate: try --baud 9600 or 115200");
    } else if (address && std::holds_alternative<TcpAddress>(*address)) {
        hints.emplace_back("is another program connected to the adapter? most take one at a time");
    }
    if (address &&
        (std::holds_alternative<BluetoothAddress>(*address) || std::holds_alternative<BleAddress>(*address))) {
        hints.emplace_back("is it the adapter? `velmora ports` lists Bluetooth devices by name");
    }
    hints.emplace_back("pull the adapter and plug it in again, or try --reset");
    return {ErrorKind::AdapterSilent, "Nothing on " + port + " answers like an ELM327 adapter", hints};
}

Error goneAdapter(std::string const& port, std::optional<PortAddress> const& address, OpeningWatch const& seen)
{
    if (seen.identification().empty()) {
        return silentAdapter(port, address, seen);
    }
    return {ErrorKind::AdapterSilent,
            seen.identification() + " answered on " + port +
                ", then fell silent: it has said nothing for seconds, not even to ATI",
            {"is it still in its socket, and in reach?", "pull the adapter and plug it in again"}};
}

Error headersMissing(std::string const& adapter, std::string const& port)
{
    return {ErrorKind::VehicleSilent,
            "The adapter (" + adapter + ") on " + port +
                " works and replies came, but they could not be read: no headers",
            {"this adapter does not do what ATH1 asks for; only another adapter helps"}};
}

Error silentVehicle(std::string const& adapter, std::string const& port, std::string const& trouble)
{
    std::vector<std::string> hints = {
        "is the ignition on?", "is the adapter firmly in the car's OBD socket?",
        "a car that is not found automatically may answer on a protocol you choose: --protocol 1 to 9"};
    std::string what = "The adapter (" + adapter + ") on " + port + " works, but no control module answers";
    if (!trouble.empty()) {
        what += "; it reports " + trouble;
        hints.insert(hints.begin() + 1, "does the wiring hold, and is nothing else plugged into the car's bus?");
    }
    return {ErrorKind::VehicleSilent, what, hints};
}

Error resettingAdapter(std::string const& port)
{
    return {ErrorKind::LinkLost,
            "The adapter on " + port + " resets itself again and again",
            {"is it firmly in its socket, and the car's battery well?",
             "a cable or hub that gives too little current does the same; another adapter may do better"}};
}

} // namespace velmora::openingfailure
