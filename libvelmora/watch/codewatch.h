#pragma once

#include "libvelmora/output/record.h"
#include "libvelmora/watch/watchtime.h"

#include <map>
#include <optional>
#include <set>
#include <string>
#include <vector>

namespace velmora {

// What one control module told of lamp and codes in one look.
struct CodeLook
{
    struct Code
    {
        std::string code;
        std::string text;
    };

    unsigned int module = 0;
    std::optional<bool> lamp; // nothing if it was not told
    // By kind ("confirmed", ...): the codes, or nothing for a list that was refused, silent or unreadable. That is not
    // the same as an empty list.
    std::map<std::string, std::optional<std::vector<Code>>> lists;
    std::optional<int> notReady; // monitors that have not run since the codes were cleared
};

// Finds what has changed from one look to the next.
class CodeWatch
{
public:
    explicit CodeWatch(std::string vehicle) : m_vehicle(std::move(vehicle)) {}

    // The lamp as it is, changes of codes, each with its event, and events of the lamp and of readiness. The first look
    // at a module tells its codes without events: they are no news.
    std::vector<Record> take(CodeLook const& look, WallTime now);

private:
    struct Known
    {
        std::optional<bool> lamp;
        std::optional<int> notReady;
        std::map<std::string, std::map<std::string, std::string>> lists; // kind, code, text
    };

    void compareList(Known& known, unsigned int module, std::string const& kind,
                     std::vector<CodeLook::Code> const& codes, WallTime now);
    void tell(std::string const& kind, unsigned int module, std::string const& text, WallTime now);

    std::string const m_vehicle;
    std::map<unsigned int, Known> m_modules;
    std::vector<Record> m_news;
};

} // namespace velmora
