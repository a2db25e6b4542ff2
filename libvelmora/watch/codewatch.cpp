#include "libvelmora/watch/codewatch.h"

#include <utility>

namespace velmora {

void CodeWatch::tell(std::string const& kind, unsigned int module, std::string const& text, WallTime now)
{
    m_news.emplace_back(Event{now, m_vehicle, kind, module, text});
}

std::vector<Record> CodeWatch::take(CodeLook const& look, WallTime now)
{
    m_news.clear();
    Known& known = m_modules[look.module];
    if (look.lamp) {
        m_news.emplace_back(LampState{now, m_vehicle, look.module, *look.lamp});
    }
    if (look.lamp && known.lamp != look.lamp) {
        if (known.lamp || *look.lamp) { // a lamp that is off at the first look is no news
            tell(*look.lamp ? "lamp_on" : "lamp_off", look.module,
                 *look.lamp ? "The malfunction lamp is on" : "The malfunction lamp is off", now);
        }
        known.lamp = look.lamp;
    }
    for (auto const& [kind, codes] : look.lists) {
        if (codes) {
            compareList(known, look.module, kind, *codes, now);
        }
    }
    if (look.notReady && known.notReady != look.notReady) {
        if (known.notReady && (*look.notReady == 0 || *known.notReady == 0)) {
            tell(*look.notReady == 0 ? "ready" : "not_ready", look.module,
                 *look.notReady == 0 ? "All monitors have run" : "Monitors have not run", now);
        }
        known.notReady = look.notReady;
    }
    return std::exchange(m_news, {});
}

void CodeWatch::compareList(Known& known, unsigned int module, std::string const& kind,
                            std::vector<CodeLook::Code> const& codes, WallTime now)
{
    bool const first = !known.lists.contains(kind);
    std::map<std::string, std::string>& before = known.lists[kind];
    std::map<std::string, std::string> current;
    for (CodeLook::Code const& each : codes) {
        if (!current.emplace(each.code, each.text).second || before.contains(each.code)) {
            continue;
        }
        m_news.emplace_back(CodeChange{now, m_vehicle, module, each.code, kind, each.text, true});
        if (!first) {
            tell("code_new", module, each.code + " (" + kind + ") " + each.text, now);
        }
    }
    for (auto const& [code, text] : before) {
        if (!current.contains(code)) {
            m_news.emplace_back(CodeChange{now, m_vehicle, module, code, kind, text, false});
            tell("code_gone", module, code + " (" + kind + ") " + text, now);
        }
    }
    before = std::move(current);
}

} // namespace velmora
