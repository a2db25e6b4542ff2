#pragma once

#include <obd/idevice.h>

#include <deque>
#include <map>
#include <optional>
#include <stdexcept>
#include <string>
#include <utility>

namespace support {

// What is answered to a question: once for each that is lined up, in their order, then what stands for always. Not
// guarded.
template <typename Question, typename Reply>
class ScriptedAnswers
{
public:
    struct Answer
    {
        obd::IDevice::Status status = obd::IDevice::Status::Ok;
        Reply reply{};
        std::optional<std::string> error{}; // thrown as std::runtime_error in place of an answer
        obd::AdapterNote note = obd::AdapterNote::None;
    };

    void always(Question const& question, Answer answer) { m_standing[question] = std::move(answer); }
    void once(Question const& question, Answer answer) { m_once[question].push_back(std::move(answer)); }

    // What is answered to questions of which nothing was said.
    void otherwise(Answer answer) { m_otherwise = std::move(answer); }

    void forget()
    {
        m_once.clear();
        m_standing.clear();
    }

    Answer take(Question const& question)
    {
        auto const lined = m_once.find(question);
        if (lined != m_once.end() && !lined->second.empty()) {
            Answer answer = std::move(lined->second.front());
            lined->second.pop_front();
            return answer;
        }
        auto const standing = m_standing.find(question);
        return standing != m_standing.end() ? standing->second : m_otherwise;
    }

private:
    std::map<Question, std::deque<Answer>> m_once;
    std::map<Question, Answer> m_standing;
    Answer m_otherwise{obd::IDevice::Status::NoResponse, {}, {}};
};

} // namespace support
