#pragma once

#include "program/exitcode.h"
#include "program/globaloptions.h"

#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace velmora::cli {

// As given on the command line, of watch and of dash, which is a watch with the page as its output.
struct WatchOptions
{
    std::vector<std::string> sensors;
    std::vector<std::string> outputs;
    std::string config;
    bool checkConfig = false;
    std::string vehicle;
    std::string vin;
    std::string stopAfter;
    std::string wake;
    bool electric = false;
    bool fast = false;
    bool page = false; // the page is what it is for
};

void addWatchOptions(CLI::App& command, WatchOptions& chosen);
ExitCode runWatch(GlobalOptions const& global, WatchOptions const& chosen);

} // namespace velmora::cli
