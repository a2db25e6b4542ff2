#pragma once

#include "libvelmora/channel/countlearner.h"

#include <filesystem>
#include <map>
#include <mutex>
#include <string>

namespace velmora {

// How an adapter that listens long behind replies was brought to listen less.
struct LearntWait
{
    unsigned int steps = 0; // of ATST, enough for the slowest reply of the last visit; 0 for an adapter that needs none
    bool isCut = false;     // it agrees to that and does not keep to it, but a blank ends its wait
};

// What is kept from visit to visit in a small file: the bus that an adapter found last, whether it can count and how it
// waits, by adapter; the frames that requests bring, by vehicle. A file that can't be read is as none; one that can't
// be written costs the next visit its haste and nothing else.
class LearntStore
{
public:
    // An empty path keeps nothing.
    explicit LearntStore(std::filesystem::path file);

    // The protocol number that led to a vehicle last, 0 for none.
    int protocol(std::string const& adapter) const;
    void setProtocol(std::string const& adapter, int protocol);
    // False for an adapter that gains nothing by counting, or refuses it.
    bool canCount(std::string const& adapter) const;
    void setCanCount(std::string const& adapter, bool can);
    LearntWait wait(std::string const& adapter) const;
    void setWait(std::string const& adapter, LearntWait const& wait);

    std::map<std::string, FrameSet> counts(std::string const& vin) const;
    void setCounts(std::string const& vin, std::map<std::string, FrameSet> const& counts);

    void save() const;
    // Drops all, the file too.
    void forget();

    // The file that goes with a settings file.
    static std::filesystem::path besides(std::filesystem::path const& settings);

private:
    struct Adapter
    {
        int protocol = 0;
        bool canCount = true;
        LearntWait wait;
    };

    void load();

    std::filesystem::path m_file;
    mutable std::mutex m_mutex;
    std::map<std::string, Adapter> m_adapters; // protected by m_mutex, as what follows
    std::map<std::string, std::map<std::string, FrameSet>> m_vehicles;
};

} // namespace velmora
