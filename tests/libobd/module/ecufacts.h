#pragma once

#include "libobd/module/obdproxy.h"
#include "libobd/powertrain/fueltrim.h"
#include "tests/support/hexbytes.h"
#include "tests/support/logcapture.h"
#include "tests/support/wire/fakedevice.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <vector>

namespace support {

// A module that reports what a test says. It is found and read by the real proxy.
class EcuFacts : public testing::Test
{
protected:
    EcuFacts() { m_proxy->setDevice(m_device); }
    ~EcuFacts() override
    {
        obd::FuelTrim::setByteBInUse(false); // holds for the process
        m_proxy->releaseEcus();
    }

    void useIso9141()
    {
        m_device->busFamily = obd::ObdProtocolIso9141;
        m_module = 0x10;
    }

    void answer(char const* request, char const* reply)
    {
        m_device->answer(hexBytes(request), m_module, hexBytes(reply));
    }
    void refuse(char const* request)
    {
        m_device->answer(hexBytes(request), FakeDevice::Answer{obd::IDevice::Status::NoResponse, {}});
    }

    // The module's PIDs of the first three ranges; the marks of the ranges come by themselves.
    void supportPids(std::vector<unsigned char> const& pids)
    {
        unsigned char const highest = *std::max_element(pids.begin(), pids.end());
        for (unsigned int base = 0; base < highest; base += 0x20) {
            auto const first = static_cast<unsigned char>(base);
            Bytes reply{0x41, first, 0, 0, 0, 0};
            for (unsigned int pid : pids) {
                if (pid > base && pid <= base + 0x20) {
                    set(reply, 2, pid - base);
                }
            }
            if (highest > base + 0x20) {
                set(reply, 2, 0x20);
            }
            m_device->answer({0x01, first}, m_module, reply);
        }
    }

    std::shared_ptr<obd::IEcu> connected()
    {
        EXPECT_TRUE(m_proxy->initialize());
        return m_proxy->firstEcu();
    }
    bool asked(char const* request) const
    {
        auto const& all = m_device->requests;
        return std::find(all.begin(), all.end(), hexBytes(request)) != all.end();
    }

    unsigned int m_module = 0x7E8;
    std::shared_ptr<FakeDevice> m_device = std::make_shared<FakeDevice>();
    std::shared_ptr<obd::ObdProxy> m_proxy = std::make_shared<obd::ObdProxy>();
    LogCapture m_log;

private:
    // Bits count from 1 at the top of the first mask byte.
    static void set(Bytes& reply, std::size_t offset, unsigned int number)
    {
        unsigned int const bit = number - 1;
        unsigned char& byte = reply[offset + bit / 8];
        byte = static_cast<unsigned char>(byte | 0x80U >> bit % 8);
    }
};

} // namespace support
