#pragma once

#include "libvelmora/port/portholder.h"

#include <functional>
#include <string>
#include <vector>

namespace velmora {

// What stands on a serial port.
struct SerialProbe
{
    enum class Outcome
    {
        Adapter,    // answers as an ELM327 does
        OtherThing, // answers, but not so
        Silent,
        Held,      // by another program
        Forbidden, // for this user
        Missing,
        NoPort, // the file is no serial port
    };

    Outcome outcome = Outcome::Missing;
    unsigned int baud = 0; // of the adapter
    std::string text;      // what it answered, or who holds the port
};

// The line rates of adapters, the usual one first.
std::vector<unsigned int> const& usualRates();

// Asks at one rate after the other who is there. Sends nothing but "ATI" and a carriage return, which modems and
// printers take no harm from, and only where no other program holds the port. Whatever is found, the line is closed
// with the settings that it had. trying is told each rate; stop is asked between the attempts.
SerialProbe probeSerialPort(std::string const& device, std::vector<unsigned int> const& rates,
                            std::function<void(unsigned int baud)> const& trying = {},
                            std::function<bool()> const& stop = {}, HolderPlaces const& places = {});

} // namespace velmora
