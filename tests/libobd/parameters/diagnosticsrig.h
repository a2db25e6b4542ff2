#pragma once

#include "tests/support/fakeecu.h"
#include "tests/support/hexbytes.h"

#include <obd/obdparameter.h>

#include <random>
#include <string_view>

// What the tests of the queries beyond service 01 share.
namespace diagnosticsrig {

using Bytes = std::vector<unsigned char>;

inline std::shared_ptr<obd::IEcu> makeEcu(obd::ObdProtocol protocol, unsigned int id = 0x7E8)
{
    auto const ecu = std::make_shared<support::FakeEcu>(id);
    ecu->setProtocol(protocol);
    return ecu;
}

// A module of each family.
inline std::shared_ptr<obd::IEcu> const canEcu = makeEcu(obd::ObdProtocolCan11);
inline std::shared_ptr<obd::IEcu> const isoEcu = makeEcu(obd::ObdProtocolIso9141, 0x10);
inline std::shared_ptr<obd::IEcu> const kwpEcu = makeEcu(obd::ObdProtocolIso14230, 0x12);
inline std::shared_ptr<obd::IEcu> const vpwEcu = makeEcu(obd::ObdProtocolJ1850, 0x10);

// Hands a parameter a reply such as "49 02 01 31" of a module.
inline bool offer(obd::ObdParameter& parameter, std::shared_ptr<obd::IEcu> const& ecu, std::string_view reply)
{
    return parameter.setResponseData(ecu, support::hexBytes(reply));
}

inline Bytes requestOf(obd::ObdParameter const& parameter)
{
    Bytes request;
    parameter.requestData(request);
    return request;
}

// The reply of a legacy bus with a byte of checksum behind each 7 byte line, as ISO 9141-2 and J1850 deliver it.
inline Bytes withChecksums(Bytes const& lines)
{
    Bytes data;
    unsigned char sum = 0;
    for (std::size_t i = 0; i < lines.size(); ++i) {
        data.push_back(lines[i]);
        sum = static_cast<unsigned char>(sum + lines[i]);
        if (i % 7 == 6) {
            data.push_back(sum);
            sum = 0;
        }
    }
    return data;
}

// Writes the signature to the start of each line of `step` bytes, and small sequence numbers behind it.
inline void stampLines(Bytes& data, Bytes const& signature, std::size_t step)
{
    for (std::size_t start = 0; start < data.size(); start += step) {
        std::size_t const room = std::min(signature.size(), data.size() - start);
        std::copy_n(signature.begin(), room, data.begin() + static_cast<std::ptrdiff_t>(start));
        if (signature.size() == 2 && start + 2 < data.size()) {
            data[start + 2] = static_cast<unsigned char>(data[start + 2] % 6);
        }
    }
}

// Random replies of every length up to 40 bytes: noise, noise behind the parameter's signature, and lines of the older
// buses without and with checksums.
template <typename Check>
void forRandomReplies(Bytes const& signature, Check check)
{
    std::mt19937 random(3779);
    for (int round = 0; round < 6; ++round) {
        for (std::size_t length = 0; length <= 40; ++length) {
            Bytes data(length);
            for (unsigned char& byte : data) {
                byte = static_cast<unsigned char>(random());
            }
            check(data);
            for (std::size_t const step : {64U, 8U, 7U}) {
                Bytes lines = data;
                stampLines(lines, signature, step);
                check(lines);
            }
        }
    }
}

constexpr obd::ObdProtocol allProtocols[] = {obd::ObdProtocolIso9141, obd::ObdProtocolIso14230,
                                             obd::ObdProtocolJ1850,   obd::ObdProtocolCan11,
                                             obd::ObdProtocolCan29,   obd::ObdProtocolUnknown};

} // namespace diagnosticsrig
