// What people give to the simulator: vehicle, drive, scenario and dialogue files, faults, control lines, and what a
// host types, by the first byte of the input.

#include "simulator/car/course.h"
#include "simulator/car/vehiclelibrary.h"
#include "simulator/control/scenario.h"
#include "simulator/dialogue.h"
#include "simulator/error.h"
#include "simulator/fault.h"
#include "simulator/simulatedcar.h"
#include "simulator/simulation.h"

#include <cstddef>
#include <sstream>
#include <string>

namespace {

using namespace obdsim;

// Lines of a host, or control lines where they begin with a colon; some time passes behind each.
void talk(std::string const& text)
{
    constexpr int mostLines = 40;
    std::shared_ptr<SimulatedCar> const car = simulateCar({});
    std::istringstream in(text);
    std::string line;
    for (int count = 0; count < mostLines && std::getline(in, line); ++count) {
        try {
            if (line.starts_with(':')) {
                car->control(line.substr(1));
            } else {
                car->receive(line + "\r");
            }
        } catch (SimulatorError const&) {
            continue; // refusing is right
        }
        car->advanceTo(car->now() + Ms(700));
    }
}

void read(unsigned char kind, std::string const& text)
{
    switch (kind % 5) {
    case 0:
        Vehicle(parseVehicle(text, "input"));
        break;
    case 1: {
        Course const course = parseDrive(text, "input").course;
        course.kilometres(course.kmh(1e6));
        break;
    }
    case 2:
        parseScenario(text, "input");
        break;
    case 3:
        parseDialogue(text, "input");
        break;
    default:
        parseFaults({text});
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(unsigned char const* data, std::size_t size)
{
    if (size == 0) {
        return 0;
    }
    std::string const text(data + 1, data + size);
    if (data[0] >= 128) {
        talk(text);
        return 0;
    }
    try {
        read(data[0], text);
    } catch (SimulatorError const&) {
        // Refusing is right.
    }
    return 0;
}
