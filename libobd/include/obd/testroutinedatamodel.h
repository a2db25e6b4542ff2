#pragma once

#include <string>

namespace obd {

/// An on-board test routine of service 08 for the application, or what became of a run of it; a copy that keeps nothing
/// of the library alive.
struct TestRoutineDataModel
{
    enum Status : int
    {
        Accepted = 0,
        Refused = 1,
        NotRun = 2, ///< or no answer
    };

    int id{0}; ///< test identifier, 0 to 255
    int status{NotRun};
    std::string message; ///< why the vehicle refused, else empty
    std::string name;    // "NA" for a routine that the library does not know
    std::string description;
};

} // namespace obd
