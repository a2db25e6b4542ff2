#pragma once

#include "tests/support/fakeclock.h"
#include "tests/support/fakeproxy.h"
#include "tests/support/logcapture.h"
#include "tests/support/payload/payload.h"

#include <gtest/gtest.h>

#include <initializer_list>

namespace derived {

using Status = obd::IQuery::UpdateStatus;
using obd::ObdMode;
using obd::UnitSystem;
using support::Bytes;

// A module behind a fake proxy, and time that passes only as a test says.
class Rig : public testing::Test
{
protected:
    static constexpr unsigned int engine = 0x7E8;

    Rig() { proxy->setEcus({ecu}); }

    void support(std::vector<unsigned char> const& pids) { ecu->setSupported(ObdMode::CurrentData, pids); }

    // The vehicle drives that fast from now on.
    void drive(unsigned int kilometresPerHour)
    {
        constexpr char digits[] = "0123456789ABCDEF";
        answer("01 0D", std::string("41 0D ") + digits[kilometresPerHour / 16] + digits[kilometresPerHour % 16]);
    }
    void answer(std::string const& request, std::string const& payload) { proxy->answer(request, payload.c_str()); }

    static std::vector<Bytes> requests(std::initializer_list<char const*> texts)
    {
        std::vector<Bytes> all;
        for (char const* text : texts) {
            all.push_back(support::hexBytes(text));
        }
        return all;
    }

    support::FakeClock clock{100000};
    support::LogCapture log;
    std::shared_ptr<support::FakeEcu> ecu = std::make_shared<support::FakeEcu>(engine);
    std::shared_ptr<support::FakeProxy> proxy = std::make_shared<support::FakeProxy>();
};

} // namespace derived
