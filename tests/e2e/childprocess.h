#pragma once

#include <string>
#include <sys/types.h>
#include <vector>

namespace e2e {

struct Outcome
{
    int exitCode; // 128 and the signal's number for a process that a signal ended
    std::string out;
    std::string err;
};

// Runs the velmora program to its end, at most two minutes. Fails the test if it takes longer.
Outcome runVelmora(std::vector<std::string> const& arguments, std::string const& input = {});

// The same on a terminal of 80 columns, where somebody types at once, and answers a question when it stands there. Its
// output is all in one.
Outcome runOnTerminal(std::vector<std::string> const& arguments, std::string const& typed = {},
                      std::string const& question = {}, std::string answer = {});

// A running velmora program; ended by its destructor.
class ChildProcess
{
public:
    explicit ChildProcess(std::vector<std::string> const& arguments);
    ~ChildProcess();
    ChildProcess(ChildProcess const&) = delete;
    ChildProcess& operator=(ChildProcess const&) = delete;

    // The next line of its standard output, without the line feed.
    std::string readLine();
    void interrupt() const;
    void hangUp() const;
    // Waits for the end and tells the exit code.
    int wait();

private:
    pid_t m_pid;
    int m_out;
};

} // namespace e2e
