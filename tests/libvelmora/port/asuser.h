#pragma once

#include <functional>
#include <string>
#include <sys/wait.h>
#include <unistd.h>

namespace velmora::test {

// Does a work in another process, and tells its exit code. The administrator is refused nothing, so that a user of no
// rights does it in the administrator's place, one who owns the device or not.
inline int asUser(std::string const& device, bool owns, std::function<int()> const& work)
{
    constexpr uid_t nobody = 65534;
    bool const isRoot = ::geteuid() == 0;
    if (isRoot && owns && ::chown(device.c_str(), nobody, nobody) != 0) {
        return -1;
    }
    pid_t const child = ::fork();
    if (child == 0) {
        ::_exit(isRoot && ::setresuid(nobody, nobody, nobody) != 0 ? -1 : work());
    }
    int status = 0;
    ::waitpid(child, &status, 0);
    return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

} // namespace velmora::test
