#pragma once

#include "libobd/message/canresponse.h"

#include <cstddef>
#include <map>
#include <vector>

namespace obd {

// The messages of the modules that answer one request, by CAN identifier. ISO 15765-4 lets eight modules answer: that
// many share one piece of memory and are found by a walk. Only a damaged reply seems to come from more, and only these
// cost memory one by one. One thread.
class CanModules
{
public:
    CanModules() { m_first.reserve(mostModules); }

    // The message of the module, which is made if it is new. Stays where it is.
    CanResponse& operator[](unsigned int id)
    {
        for (Module& module : m_first) {
            if (module.id == id) {
                return module.message;
            }
        }
        return make(id);
    }

    bool empty() const { return m_first.empty(); }

    // Hands each identifier and its message, to be moved from, to the visitor; in no particular order.
    template <typename Visitor>
    void drain(Visitor visit)
    {
        for (Module& module : m_first) {
            visit(module.id, module.message);
        }
        for (auto& [id, message] : m_more) {
            visit(id, message);
        }
    }

private:
    static constexpr std::size_t mostModules = 8;

    CanResponse& make(unsigned int id);

    struct Module
    {
        explicit Module(unsigned int canId) : id(canId) {}

        unsigned int id;
        CanResponse message;
    };

    std::vector<Module> m_first; // never grows beyond what was reserved
    std::map<unsigned int, CanResponse> m_more;
};

} // namespace obd
