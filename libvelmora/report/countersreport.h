#pragma once

#include "libvelmora/report/moduletopic.h"

#include <string>
#include <vector>

namespace velmora {

// How often monitors could run and did.
struct CountersReport
{
    struct Counter
    {
        std::string name;
        unsigned int value;
    };

    TopicAnswer answer = TopicAnswer::NotOffered;
    std::vector<Counter> counters; // those that are not 0
};

Json toJsonValue(CountersReport const& report);

} // namespace velmora
