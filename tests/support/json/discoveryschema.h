#pragma once

#include "tests/support/temporaryfolder.h"

#include <cstdlib>
#include <fstream>
#include <string>

namespace testsupport {

// 0 if the message is as Home Assistant's discovery of devices wants it.
inline int discoveryComplaint(TemporaryFolder const& folder, std::string const& message)
{
    std::ofstream(folder.file("message")) << message;
    std::string const program = "import json,sys,jsonschema; a=[json.load(open(f)) for f in sys.argv[1:]]; "
                                "jsonschema.Draft202012Validator(a[0]).validate(a[1])";
    return std::system(("python3 -c '" + program +
                        "' " VELMORA_SOURCE_DIR "/tests/support/json/homeassistant.schema.json " +
                        folder.file("message") + " 2>/dev/null")
                           .c_str());
}

} // namespace testsupport
