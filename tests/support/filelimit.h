#pragma once

#include <csignal>
#include <sys/resource.h>

namespace testsupport {

// While it lives no file of this process can grow beyond so many bytes: what a full disk does to a file, on any disk.
class FileLimit
{
public:
    explicit FileLimit(unsigned long long bytes) : m_handler(std::signal(SIGXFSZ, SIG_IGN))
    {
        ::getrlimit(RLIMIT_FSIZE, &m_before);
        rlimit const limit{bytes, m_before.rlim_max};
        ::setrlimit(RLIMIT_FSIZE, &limit);
    }
    ~FileLimit()
    {
        ::setrlimit(RLIMIT_FSIZE, &m_before);
        std::signal(SIGXFSZ, m_handler);
    }
    FileLimit(FileLimit const&) = delete;
    FileLimit& operator=(FileLimit const&) = delete;

private:
    rlimit m_before{};
    void (*m_handler)(int);
};

} // namespace testsupport
