#include "libvelmora/doctor/portcheck.h"

#include "libvelmora/port/serialprobe.h"

#include <fmt/format.h>

#include <algorithm>
#include <fstream>
#include <grp.h>
#include <sys/stat.h>

namespace velmora {

namespace {

using Outcome = SerialProbe::Outcome;
using Verdict = DoctorCheck::Verdict;

constexpr int slowLatency = 4; // ms; the chips come with 16

std::string groupOf(std::string const& device)
{
    struct stat status = {};
    if (::stat(device.c_str(), &status) != 0) {
        return {};
    }
    group const* const entry = ::getgrgid(status.st_gid);
    return entry != nullptr ? entry->gr_name : "";
}

// Some USB converters gather bytes before they hand them on.
void checkLatency(std::vector<DoctorCheck>& checks, std::string const& device, std::filesystem::path const& sysRoot)
{
    std::filesystem::path const file =
        sysRoot / "class" / "tty" / std::filesystem::path(device).filename() / "device" / "latency_timer";
    int latency = 0;
    if (std::ifstream in(file); in >> latency && latency > slowLatency) {
        checks.push_back({"port", Verdict::Note,
                          fmt::format("the USB converter holds short replies back for {} ms", latency),
                          "as root: echo 1 > " + file.string()});
    }
}

DoctorCheck judge(SerialProbe const& probe, SerialAddress const& address)
{
    switch (probe.outcome) {
    case Outcome::Adapter:
        return {"line", probe.baud == address.baud ? Verdict::Good : Verdict::Bad,
                fmt::format("an adapter answers at {} baud", probe.baud),
                probe.baud == address.baud ? "" : fmt::format("name the rate: --baud {}", probe.baud)};
    case Outcome::OtherThing:
        return {"line", Verdict::Bad, "something answers that is no adapter: \"" + probe.text.substr(0, 60) + "\"",
                "choose another port; `velmora ports` lists them"};
    case Outcome::Held:
        return {"port", Verdict::Bad,
                "held by " + (probe.text.empty() ? "another program; by which is not readable" : probe.text),
                "end that program"};
    case Outcome::Forbidden:
        return {"port", Verdict::Bad, "not yours to open",
                "add your user to the group " + groupOf(address.device) + " and log in again"};
    case Outcome::Missing:
        return {"port", Verdict::Bad, "there is no " + address.device + ", or it can't be opened",
                "is the adapter plugged in? `velmora ports` lists what is there"};
    case Outcome::NoPort:
        return {"port", Verdict::Bad, address.device + " is no serial port", "`velmora ports` lists what is there"};
    default:
        return {"line", Verdict::Bad, "nothing answers at any usual rate",
                "has the adapter power from the car's socket? pull it and plug it in again"};
    }
}

} // namespace

std::vector<DoctorCheck> checkPort(PortAddress const& address, std::filesystem::path const& sysRoot)
{
    auto const* const serial = std::get_if<SerialAddress>(&address);
    if (serial == nullptr) {
        return {{"port", Verdict::Good, toString(address), ""}};
    }
    std::vector<unsigned int> rates = usualRates();
    std::erase(rates, serial->baud);
    rates.insert(rates.begin(), serial->baud);
    std::vector<DoctorCheck> checks;
    DoctorCheck const check = judge(probeSerialPort(serial->device, rates), *serial);
    if (check.link == "line") {
        checks.push_back({"port", Verdict::Good, serial->device + " is there and free", ""});
        checkLatency(checks, serial->device, sysRoot);
    }
    checks.push_back(check);
    return checks;
}

} // namespace velmora
