#pragma once

#include "libvelmora/signal/signal.h"
#include "libvelmora/uds/moduleasker.h"
#include "libvelmora/uds/standingguard.h"

#include <nlohmann/json_fwd.hpp>

#include <filesystem>
#include <functional>
#include <map>
#include <optional>
#include <string>
#include <vector>

namespace velmora {

// What a run of requests for one identifier after the other is about.
struct ProbeTask
{
    std::string header; // of the module
    std::string reply;
    std::optional<unsigned char> extended;
    unsigned char service = 0x22;
    unsigned int from = 0xF100;
    unsigned int to = 0xF1FF;

    bool operator==(ProbeTask const&) const = default;
};

// What a module has answered so far.
struct ProbeState
{
    ProbeTask task;
    std::string vin;
    unsigned int next = 0;                                     // identifier
    std::map<unsigned int, std::vector<unsigned char>> told;   // data by identifier
    std::map<unsigned int, unsigned char> locked;              // code of the refusal, by identifier
    std::map<unsigned int, unsigned char> later;               // conditions were not right: code of the refusal
    std::map<unsigned int, std::vector<unsigned char>> second; // data of the second look
    bool done = false;
};

// A run that was interrupted goes on from its file, on the same vehicle only.
class ProbeStore
{
public:
    explicit ProbeStore(std::filesystem::path file) : m_file(std::move(file)) {}

    // Nothing if there is no run under way.
    std::optional<ProbeState> load() const;
    // Throws Error if it can't be written.
    void save(ProbeState const& state) const;
    void drop() const;

    // One file for each module and service.
    static std::filesystem::path besides(std::filesystem::path const& settings, ProbeTask const& task);

private:
    std::filesystem::path m_file;
};

// Asks for the identifiers of a range one by one, five a second, then once more for those that told something.
class IdentifierProbe
{
public:
    // check is called between requests and throws to end the run; save is called now and then, and at its end.
    IdentifierProbe(ModuleAsker& asker, std::function<void()> check, std::function<void(ProbeState const&)> save,
                    std::function<void(ProbeState const&)> progress);

    // Goes on from the state until all is done. Throws Error on trouble, with the state saved.
    void run(ProbeState& state);

private:
    ModuleAnswer::Kind ask(ProbeState& state, RequestAddress const& address, unsigned int id);
    void lookAgain(ProbeState& state, RequestAddress const& address, StandingGuard& guard);
    void pace();

    ModuleAsker& m_asker;
    std::function<void()> const m_check;
    std::function<void(ProbeState const&)> const m_save;
    std::function<void(ProbeState const&)> const m_progress;
    std::optional<std::uint32_t> m_last;
};

// A task checked against what may be sent. Throws Error (wrong use).
void checkProbe(ProbeTask const& task);

// Signals to start from: each identifier that told something with a formula of its bytes, its meaning left open.
SignalFile toSignalFile(ProbeState const& state);

nlohmann::ordered_json toJsonValue(ProbeState const& state);

// "F190" of service 22, "06" of service 21.
std::string probeIdText(ProbeTask const& task, unsigned int id);

} // namespace velmora
