#pragma once

#include <algorithm>
#include <cstddef>
#include <set>

namespace velmora {

// How many PIDs one control module takes in one request, as far as it has proved it: first two, which fit in a single
// frame, then three, then as many as the standard allows. Some adapters cut a request short, and some modules refuse
// more than one PID or answer only in part; a reply that can't be taken apart ends the attempt for the connection.
class MultiLimit
{
public:
    static constexpr std::size_t most = 6; // ISO 15765-4

    // 1 for a bus that allows no more, or a user who wants no more. A request holds one at least.
    explicit MultiLimit(std::size_t highest) : m_highest(std::max<std::size_t>(highest, 1)) {}

    // How many may be asked for at once now.
    std::size_t now() const;

    // So many came at once and whole.
    void proved(std::size_t count);
    // A request for so many was answered by something that can't be taken apart, or was refused.
    void failed(std::size_t count);
    // A request for so many was not answered. Where the size is proved already, a lost reply is likelier than a module
    // that has changed its mind, so only the third in a row counts.
    void missed(std::size_t count);

    // PIDs that the module left out of a reply are asked for alone from then on.
    void leftOut(unsigned char pid) { m_alone.insert(pid); }
    bool isAlone(unsigned char pid) const { return m_alone.contains(pid); }

private:
    std::size_t m_highest;
    std::size_t m_proved = 1;
    int m_missed = 0;
    std::set<unsigned char> m_alone;
};

} // namespace velmora
