#include "libobd/parameters/testroutine.h"

#include "libobd/parameters/replychecks.h"

#include <obd/protocolfamily.h>

namespace obd {
namespace {

constexpr std::size_t canReplyLength = 2;
constexpr std::size_t legacyReplyLength = 7;

} // namespace

TestRoutine::TestRoutine(unsigned char id, ObdProtocol protocol)
    : FixedRequestParameter({0x08, id}, requestFillers(protocol))
{}

void TestRoutine::clear()
{
    m_results.clear();
}

TestRoutine::Result TestRoutine::result(IEcu const& ecu) const
{
    Result const* const result = findOrLog(m_results, ecu);
    return result != nullptr ? *result : NoAnswer;
}

bool TestRoutine::fromBytes(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data)
{
    return isCan(ecu->protocol()) ? parseFromCanBus(ecu->id(), data) : parseFromNonCanBus(ecu->id(), data);
}

// On CAN a module refuses by a negative reply, so a positive one is the acceptance.
bool TestRoutine::parseFromCanBus(unsigned int ecuId, std::vector<unsigned char> const& data)
{
    if (data.size() < canReplyLength) {
        return false;
    }
    m_results[ecuId] = Accepted;
    return true;
}

bool TestRoutine::parseFromNonCanBus(unsigned int ecuId, std::vector<unsigned char> const& data)
{
    if (data.size() < legacyReplyLength) {
        return false;
    }
    m_results[ecuId] = data[2] != 0 ? Refused : Accepted;
    return true;
}

} // namespace obd
