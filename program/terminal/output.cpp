#include "program/terminal/output.h"

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <system_error>

namespace velmora::cli {

namespace {

bool failedLate = false; // the main thread's

} // namespace

bool writeOutput(std::string const& text)
{
    bool const written = std::fwrite(text.data(), 1, text.size(), stdout) == text.size() && std::fflush(stdout) == 0;
    if (!written && errno != EPIPE) {
        throw outputFailure(errno);
    }
    return written;
}

void flushOutput()
{
    if (std::fflush(stdout) != 0) {
        throw std::system_error(errno, std::generic_category(), "standard output");
    }
}

void tell(std::string const& text)
{
    std::fputs(text.c_str(), stderr);
}

void tellLateFailure(std::string const& text)
{
    tell("velmora: " + text + "\n");
    failedLate = true;
}

bool lateFailure()
{
    return failedLate;
}

Error outputFailure(int error)
{
    return {ErrorKind::Failed,
            std::string("Could not write to standard output: ") + std::strerror(error),
            {"is the disk full that it goes to?"}};
}

} // namespace velmora::cli
