#include "libvelmora/port/doorbell.h"

#include <velmora/error.h>

#include <cerrno>
#include <cstring>
#include <sys/eventfd.h>
#include <unistd.h>

namespace velmora {

Doorbell::Doorbell() : m_descriptor(::eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK))
{
    if (m_descriptor < 0) {
        throw Error(ErrorKind::PortFailed, std::string("Could not wait for a port: ") + std::strerror(errno),
                    {"does this program have too many files open?"});
    }
}

Doorbell::~Doorbell()
{
    ::close(m_descriptor);
}

void Doorbell::ring() const
{
    ::eventfd_write(m_descriptor, 1);
}

void Doorbell::hush() const
{
    eventfd_t rings = 0;
    ::eventfd_read(m_descriptor, &rings);
}

} // namespace velmora
