#include "libvelmora/signal/signaltable.h"

#include "libvelmora/signal/signalreader.h"

namespace velmora {

Signal SignalReader::read()
{
    for (auto const& [key, node] : m_table) {
        auto const found = readers().find(key.str());
        if (found == readers().end()) {
            mistake(node, std::string(key.str()), "is no key of a signal");
        } else {
            m_key = found->first;
            found->second(*this, node);
        }
    }
    checkWhole();
    return std::move(m_signal);
}

void SignalReader::mistake(toml::node const& node, std::string const& key, std::string const& what)
{
    m_mistakes.push_back({node.source().begin.line, m_place + ", " + key, what});
}

void SignalReader::missing(std::string const& key, std::string const& what)
{
    m_mistakes.push_back({m_table.source().begin.line, m_place + ", " + key, what});
}

// What no key alone tells.
void SignalReader::checkWhole()
{
    if (!m_table.contains("id")) {
        missing("id", "is missing");
    }
    if (!m_table.contains("name")) {
        missing("name", "is missing");
    }
    if (m_table.contains("formula") == m_table.contains("text")) {
        missing("formula", "each signal wants either a formula or a text");
    }
    if (!m_table.contains("request") && (!m_signal.formula || bytesReadBy(*m_signal.formula) > 0)) {
        missing("request", "is missing; only a formula of other signals' values needs none");
    }
    checkAddresses();
    if (m_signal.min && m_signal.max && *m_signal.min >= *m_signal.max) {
        missing("min", "must be less than max");
    }
}

void SignalReader::checkAddresses()
{
    bool const standard =
        m_signal.header.empty() || isFunctionalHeader(m_signal.header) || standardReply(m_signal.header);
    if (!standard && !m_table.contains("reply")) {
        missing("reply", "is missing; only 7E0 to 7E7 and 18DAxxF1 have replies that follow from the header");
    }
    if (m_signal.extendedAddress && m_signal.header.empty()) {
        missing("ext", "needs a header");
    }
}

Signal readSignal(toml::table const& table, std::string const& place, std::vector<SignalMistake>& mistakes)
{
    return SignalReader(table, place, mistakes).read();
}

} // namespace velmora
