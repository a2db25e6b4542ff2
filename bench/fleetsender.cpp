// Stands for many cars: fleetsender RECORDING RATE (NAME OUTPUT)...
//
// Each NAME gets the readings of the recording (lines of JSON, as the output ndjson writes them) at RATE a second, with
// the time of now, through the real output with its queue, thread and spool. At SIGTERM it waits until all spools are
// empty, at most five minutes, and tells how many readings each was given: "sent NAME COUNT".

#include "libvelmora/output/opening/outputfactory.h"
#include "libvelmora/output/outputrunner.h"

#include <nlohmann/json.hpp>

#include <algorithm>
#include <csignal>
#include <fstream>
#include <iostream>
#include <thread>

namespace {

using namespace velmora;

std::atomic<bool> ended{false};

struct Sender
{
    std::string name;
    std::unique_ptr<OutputRunner> runner;
    std::size_t next = 0;
    std::uint64_t count = 0;
};

std::vector<Reading> readRecording(std::string const& file)
{
    std::vector<Reading> readings;
    std::ifstream in(file);
    for (std::string line; std::getline(in, line);) {
        auto const json = nlohmann::json::parse(line, nullptr, false);
        if (!json.is_object() || !json.contains("sensor") || !json["value"].is_number()) {
            continue;
        }
        Reading reading;
        reading.module = static_cast<unsigned int>(std::stoul(json["module"].get<std::string>(), nullptr, 16));
        reading.sensor = json["sensor"];
        reading.pid = json["pid"];
        reading.name = json["name"];
        reading.value = json["value"].get<double>();
        reading.unit = json["unit"];
        readings.push_back(reading);
    }
    return readings;
}

std::vector<Sender> makeSenders(int count, char** words)
{
    std::vector<Sender> senders;
    for (int i = 0; i + 1 < count; i += 2) {
        OutputContext context;
        context.vehicle = words[i];
        context.tell = [name = context.vehicle](std::string const& text) { std::cerr << name + ": " + text + "\n"; };
        senders.push_back({context.vehicle,
                           std::make_unique<OutputRunner>(
                               context.vehicle, makeOutput(parseOutputAddress(words[i + 1]), context), context.tell),
                           static_cast<std::size_t>(i), 0});
        senders.back().runner->start();
    }
    return senders;
}

void give(Sender& sender, std::vector<Reading> const& recording)
{
    Reading reading = recording[sender.next++ % recording.size()];
    reading.time = std::chrono::system_clock::now();
    reading.vehicle = sender.name;
    sender.runner->push(std::make_shared<Record const>(std::move(reading)));
    ++sender.count;
}

bool isDrained(Sender const& sender)
{
    OutputCounts const counts = sender.runner->counts();
    return counts.written == counts.accepted && counts.state.waiting == std::uint64_t{0};
}

} // namespace

int main(int argc, char** argv)
{
    if (argc < 5) {
        std::cerr << "fleetsender RECORDING RATE (NAME OUTPUT)...\n";
        return 2;
    }
    std::signal(SIGTERM, [](int) { ended = true; });
    std::vector<Reading> const recording = readRecording(argv[1]);
    if (recording.empty()) {
        std::cerr << argv[1] << " holds no readings\n";
        return 1;
    }
    std::vector<Sender> senders = makeSenders(argc - 3, argv + 3);
    auto const period = std::chrono::duration<double>(1.0 / std::stod(argv[2]));
    for (auto next = std::chrono::steady_clock::now(); !ended;) {
        for (Sender& each : senders) {
            give(each, recording);
        }
        next += std::chrono::duration_cast<std::chrono::steady_clock::duration>(period);
        std::this_thread::sleep_until(next);
    }
    auto const limit = std::chrono::steady_clock::now() + std::chrono::minutes(5);
    while (!std::ranges::all_of(senders, isDrained) && std::chrono::steady_clock::now() < limit) {
        std::this_thread::sleep_for(std::chrono::milliseconds(100));
    }
    for (Sender& each : senders) {
        each.runner->beginStop();
    }
    for (Sender& each : senders) {
        each.runner->stop();
        std::cout << "sent " << each.name << " " << each.count << "\n";
    }
    return 0;
}
