#include "libvelmora/channel/countlearner.h"

#include <algorithm>

namespace velmora {

namespace {

constexpr int enoughToLearn = 2;
constexpr int mostFailures = 3;
constexpr unsigned int highestCount = 9; // some adapters know no higher digit
// Now and then a request is asked plainly, so that a module that comes back is found.
constexpr WireTime checkEach{30000};
// Counting pays when it saves a fifth of the time, which is judged on some replies.
constexpr int enoughToJudge = 3;

unsigned int sum(FrameSet const& frames)
{
    unsigned int count = 0;
    for (auto const& [module, moduleFrames] : frames) {
        count += moduleFrames;
    }
    return count;
}

} // namespace

std::optional<unsigned int> CountLearner::countFor(std::string const& request, WireTime now) const
{
    auto const found = m_entries.find(request);
    if (m_off || found == m_entries.end() || found->second.equal < enoughToLearn || found->second.useless) {
        return std::nullopt;
    }
    unsigned int const count = sum(found->second.frames);
    if (count == 0 || count > highestCount || now - m_lastCheck >= checkEach) {
        return std::nullopt;
    }
    return count;
}

void CountLearner::learn(std::string const& request, FrameSet const& frames, WireTime took, WireTime now)
{
    Entry& entry = m_entries[request];
    if (entry.equal >= enoughToLearn && entry.frames != frames) {
        clear(); // other modules than before: all that was learnt is in doubt
        m_entries[request] = {.frames = frames, .equal = 1, .plain = took};
    } else if (entry.frames == frames) {
        entry.plain = std::min(entry.plain, took);
        ++entry.equal;
    } else {
        entry = {.frames = frames, .equal = 1, .plain = took};
    }
    m_lastCheck = now;
}

bool CountLearner::accept(std::string const& request, FrameSet const& frames, WireTime took)
{
    auto const found = m_entries.find(request);
    if (found == m_entries.end() || found->second.frames != frames) {
        return false;
    }
    Entry& entry = found->second;
    entry.counted = entry.accepted == 0 ? took : std::min(entry.counted, took);
    ++entry.accepted;
    ++m_accepted;
    bool const judged = entry.accepted >= enoughToJudge && entry.plain > WireTime(0);
    entry.useless = judged && entry.counted * 5 > entry.plain * 4;
    return true;
}

void CountLearner::fail(std::string const& request)
{
    forget(request);
    m_off = m_off || ++m_failures >= mostFailures;
}

std::map<std::string, FrameSet> CountLearner::learnt() const
{
    std::map<std::string, FrameSet> kept;
    for (auto const& [request, entry] : m_entries) {
        if (entry.equal >= enoughToLearn && !entry.useless) {
            kept[request] = entry.frames;
        }
    }
    return kept;
}

void CountLearner::recall(std::string const& request, FrameSet const& frames)
{
    m_entries.try_emplace(request, Entry{.frames = frames, .equal = enoughToLearn});
}

} // namespace velmora
