#include "libvelmora/port/opening/portprobe.h"

#include <chrono>
#include <condition_variable>
#include <mutex>
#include <string>

namespace velmora {

namespace {

constexpr std::chrono::seconds probeAnswerLimit{3}; // a radio takes up to some tenths more than a wire
constexpr std::chrono::milliseconds probeStopStep{100};
constexpr std::size_t longestProbeAnswer = 4096;

struct Answer
{
    bool isWhole() const { return lost || text.size() > longestProbeAnswer || text.find('>') != std::string::npos; }

    std::mutex mutex;
    std::condition_variable more;
    std::string text;
    bool lost = false;
};

} // namespace

bool answersAsAdapter(std::unique_ptr<IPort> port, OpeningStop const& stop)
{
    Answer answer;
    auto const change = [&answer](auto apply) {
        std::lock_guard const lock(answer.mutex);
        apply();
        answer.more.notify_one();
    };
    port->start([&](std::string_view bytes) { change([&] { answer.text += bytes; }); },
                [&] { change([&] { answer.lost = true; }); });
    port->write("ATI\r");
    auto const end = std::chrono::steady_clock::now() + probeAnswerLimit;
    {
        std::unique_lock lock(answer.mutex);
        while (!answer.isWhole() && std::chrono::steady_clock::now() < end && !(stop && stop())) {
            answer.more.wait_for(lock, probeStopStep);
        }
    }
    port->close();
    return answer.text.find('>') != std::string::npos;
}

} // namespace velmora
