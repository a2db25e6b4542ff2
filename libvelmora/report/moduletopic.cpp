#include "libvelmora/report/moduletopic.h"

namespace velmora {

char const* answerWord(TopicAnswer answer)
{
    static constexpr char const* words[] = {"read", "not supported", "no answer", "unreadable", "refused"};
    return words[static_cast<int>(answer)];
}

} // namespace velmora
