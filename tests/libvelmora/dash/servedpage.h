#pragma once

#include "libvelmora/dash/dashoutput.h"
#include "tests/support/process/httpclient.h"
#include "tests/support/temporaryfolder.h"

#include <memory>
#include <string>

namespace velmora::test {

using testsupport::HttpClient;

inline Reading dashReading(std::string const& sensor, double value, std::int64_t millis = 1000)
{
    Reading reading;
    reading.time = std::chrono::system_clock::time_point(std::chrono::milliseconds(millis));
    reading.module = 0x7E8;
    reading.sensor = sensor;
    reading.name = "Engine " + sensor;
    reading.unit = "rpm";
    reading.value = value;
    return reading;
}

// The page's server with a car that the test plays.
struct Page
{
    testsupport::TemporaryFolder folder;
    std::shared_ptr<DashDesk> desk = std::make_shared<DashDesk>();
    std::string link;
    std::unique_ptr<DashOutput> output;

    explicit Page(std::string const& options = "")
    {
        velmora::DashContext context;
        context.desk = desk;
        context.layouts = folder.file("layouts.toml");
        context.onLink = [this](std::string const& where, std::string const& /*remark*/) { link = where; };
        output = std::make_unique<DashOutput>(velmora::parseOutputAddress("dash:127.0.0.1:0" + options), context);
        output->open();
        desk->tell(velmora::DashVehicle{"van", {{0x7E8, "RPM", "010C", "Engine RPM", "rpm"}}});
    }

    std::string host() const { return "127.0.0.1:" + std::to_string(output->port()); }
    std::string token() const { return link.find("#t=") == std::string::npos ? "" : link.substr(link.find("#t=") + 3); }
    std::string get(std::string const& path, std::string const& more = "") const
    {
        return HttpClient(output->port())
            .ask("GET " + path + " HTTP/1.1\r\nHost: " + host() + "\r\nConnection: close\r\n" + more + "\r\n");
    }
    std::string post(std::string const& path, std::string const& body, std::string const& more = "") const
    {
        return HttpClient(output->port())
            .ask("POST " + path + " HTTP/1.1\r\nHost: " + host() + "\r\nOrigin: http://" + host() +
                 "\r\nConnection: close\r\nContent-Length: " + std::to_string(body.size()) + "\r\n" + more + "\r\n" +
                 body);
    }
    std::string cookie() const { return "Cookie: velmora_" + std::to_string(output->port()) + "=" + token() + "\r\n"; }
};

// The data of the next event of that name.
inline Json nextEvent(HttpClient& stream, std::string const& name)
{
    stream.readUntil("event: " + name + "\ndata: ");
    return Json::parse(stream.readUntil("\n"), nullptr, false);
}

} // namespace velmora::test
