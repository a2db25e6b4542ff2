#include "libobd/parameters/calibrationverificationnumbers.h"

#include "libobd/parameters/bytetext.h"
#include "libobd/parameters/replychecks.h"
#include "libobd/parameters/saelines.h"

#include <common/logrecord.h>

namespace obd {
namespace {

constexpr std::size_t numberLength = 4;

} // namespace

void CalibrationVerificationNumbers::clear()
{
    m_numbers.clear();
}

std::vector<std::string> CalibrationVerificationNumbers::verificationNumbers(std::shared_ptr<IEcu> const& ecu) const
{
    return findOrEmpty(m_numbers, *ecu);
}

bool CalibrationVerificationNumbers::fromCanSystem(unsigned int ecuId, std::vector<unsigned char> const& data)
{
    if (data.size() < infoHeaderLength + numberLength) {
        return refuseLength(data);
    }
    unsigned int const count = data[2];
    TERVEX_LOG(Info) << "Number of verification items: " << count;
    if (infoHeaderLength + numberLength * count > data.size()) {
        return refuseLength(data);
    }
    for (std::size_t item = 0; item < count; ++item) {
        m_numbers[ecuId].push_back(hexText(slice(data, infoHeaderLength + item * numberLength, numberLength)));
    }
    return true;
}

bool CalibrationVerificationNumbers::fromSaeSystem(unsigned int ecuId, std::vector<unsigned char> const& data)
{
    std::optional<SaeLines> const lines = saeLines(data);
    if (!lines) {
        return false;
    }
    for (std::size_t line = 0; line < lines->count(); ++line) {
        m_numbers[ecuId].push_back(hexText(lines->data(line)));
    }
    return true;
}

} // namespace obd
