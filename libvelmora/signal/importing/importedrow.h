#pragma once

#include "libvelmora/signal/importing/signalimport.h"

#include <map>
#include <set>
#include <string>

namespace velmora {

// Collects the signals of an import, which refer to each other by the names that their own form gives them.
class ImportCollector
{
public:
    explicit ImportCollector(std::string const& path) { m_import.file.path = path; }

    // A new id made of a name: capitals, digits and '_', numbered where it would be one twice.
    std::string newId(std::string const& name);

    void refuse(std::size_t line, std::string const& what, std::string const& why);
    void note(std::size_t line, std::string const& what, std::string const& why);
    void add(std::size_t line, Signal signal);
    // The same for one that got no id yet, which is made of its name; what is to be told of it is noted.
    void addNamed(std::size_t line, Signal signal);
    // A further name that formulas have for a signal.
    void call(std::string const& name, std::string const& id) { m_idOf.emplace(name, id); }
    bool knows(std::string const& name) const { return m_idOf.contains(name); }

    // Puts ids in the place of names in formulas; refuses signals whose formula names none of this file.
    SignalImport finish();

private:
    void dropUnresolved();

    SignalImport m_import;
    std::vector<std::size_t> m_lines;          // of the signals
    std::map<std::string, std::string> m_idOf; // by name
    std::set<std::string> m_ids;
};

// Fills in header and reply as a form without a reply filter leaves them open: nothing for pairs that follow from the
// header, else what the next rule makes, which is told in reason. False for a header that is none.
bool fillAddresses(Signal& signal, std::string const& header);

// Leaves a signal out of what is read unasked, since its module answers in a session alone that nobody opens. What
// names it: "session 03".
void requireSession(Signal& signal, std::string const& what);

// Its range, where a file tells both ends in their order; else none.
void fillRange(Signal& signal, std::optional<double> min, std::optional<double> max);

// The label that the program uses for a unit as such files spell it.
std::string knownUnit(std::string const& unit);

} // namespace velmora
