#pragma once

#include "libvelmora/signal/builtinpids.h"
#include "libvelmora/signal/signal.h"

#include <filesystem>
#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace velmora {

// A signal that can be chosen, and where it comes from.
struct SignalEntry
{
    Signal signal;
    std::string path;       // of its file; empty for a built-in one
    std::string vin;        // pattern of the vehicles that the file is for
    std::size_t length = 0; // data bytes that every reply has; 0: any
    std::optional<FormulaNode> supported;
    PidStanding standing = PidStanding::Recorded;

    bool isBuiltIn() const { return path.empty(); }
};

// The signals of the user's files, and the built-in definitions. What a signal is called by in a poller, its number, is
// its place in the set and firstSignalId. It does not change.
class SignalSet
{
public:
    // No files: the built-in definitions only.
    SignalSet();
    // The files that the user names, and those of the folder. Throws Error for a named one that can't be read or holds
    // mistakes; what is wrong with one of the folder is told, and it is passed over.
    SignalSet(std::vector<std::string> const& files, std::filesystem::path const& folder,
              std::function<void(std::string const&)> const& tell);

    std::vector<SignalEntry> const& entries() const { return m_entries; }
    SignalEntry const& operator[](std::size_t index) const { return m_entries[index]; }

    // What a word means: the id or the whole name of a signal, or the PID of built-in ones ("A6", "01A6"). A file's
    // signal goes before a built-in one of the same id.
    std::vector<std::size_t> find(std::string const& word) const;
    // The user's signals in whose name all words stand.
    std::vector<std::size_t> search(std::string const& words) const;
    // The signal of an id in the same file.
    std::optional<std::size_t> sibling(std::size_t index, std::string const& id) const;

    // The folder of signal files that goes with a settings file.
    static std::filesystem::path folderBesides(std::filesystem::path const& settings);

private:
    void add(SignalFile const& file);
    void addBuiltIns();

    std::vector<SignalEntry> m_entries;
    std::map<std::string, std::size_t> m_byId;   // in capitals; the first of several
    std::map<std::string, std::size_t> m_byName; // the same
    std::map<std::string, std::map<std::string, std::size_t>> m_byFile;
};

// The ids of parameters end far below.
constexpr int firstSignalId = 0x10000;

int signalId(std::size_t index);

// Whether a VIN fits a pattern in which ? is any character and * any text. An empty pattern fits all.
bool fitsVin(std::string const& pattern, std::string const& vin);

} // namespace velmora
