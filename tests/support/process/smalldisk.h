#pragma once

#include <sched.h>
#include <string>
#include <sys/mount.h>

namespace testsupport {

// Mounts a disk of so many megabytes there, in a name space of the process's own, where no rights are needed. False if
// that can't be done here.
inline bool mountSmallDisk(std::string const& folder, int megabytes)
{
    return (::unshare(CLONE_NEWNS) == 0 || ::unshare(CLONE_NEWUSER | CLONE_NEWNS) == 0) &&
           ::mount(nullptr, "/", nullptr, MS_REC | MS_PRIVATE, nullptr) == 0 &&
           ::mount("none", folder.c_str(), "tmpfs", 0, ("size=" + std::to_string(megabytes) + "M").c_str()) == 0;
}

} // namespace testsupport
