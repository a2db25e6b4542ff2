#include "libobd/module/obdproxy.h"
#include "tests/support/logcapture.h"
#include "tests/support/wire/fakedevice.h"

#include <obd/nack.h>
#include <obd/obdparameter.h>
#include <obd/powertrainparameter.h>
#include <obd/sensorinfo.h>
#include <obd/sensorvalue.h>

#include <gtest/gtest.h>

#include <functional>
#include <stdexcept>

namespace {

using namespace obd;
using support::Bytes;
using UpdateStatus = IQuery::UpdateStatus;

class Probe : public ObdParameter
{
public:
    explicit Probe(Bytes signature = {0x41, 0x0C}) : m_signature(std::move(signature)) {}

    using ObdParameter::findSaeChecksumLength;
    using ObdParameter::verifySaeSignature;
    using ObdParameter::verifySaeSignatures;

    std::map<unsigned int, Bytes> stored;
    std::function<bool()> accept = [] { return true; };

protected:
    void getRequestData(Bytes& data) const override { data = {0x01, 0x0C}; }
    void getSignature(Bytes& signature) const override { signature = m_signature; }
    bool fromBytes(std::shared_ptr<IEcu> const& ecu, Bytes const& data) override
    {
        if (!accept()) {
            return false;
        }
        stored[ecu->id()] = data;
        return true;
    }

private:
    Bytes m_signature;
};

class SpeedParameter : public PowertrainParameter
{
public:
    using PowertrainParameter::PowertrainParameter;

    Bytes payload;

    ParameterIdentifier::Id pid() const override { return ParameterIdentifier::Id(0x0C); }
    std::string description(IEcu const& /*ecu*/) override { return {}; }
    std::vector<std::shared_ptr<SensorInfo const>> sensorInfo(IEcu const& /*ecu*/) override { return {}; }
    std::vector<std::shared_ptr<SensorValue>> values(IEcu const& /*ecu*/, UnitSystem /*system*/) override { return {}; }

protected:
    bool fromPayload(std::shared_ptr<IEcu> const& /*ecu*/, Bytes const& bytes) override
    {
        payload = bytes;
        return true;
    }
};

class Parameter : public testing::Test
{
protected:
    Parameter()
    {
        for (unsigned int const id : {0x18U, 0x7E8U, 0x7E9U}) {
            m_device->answer({0x01, 0x00}, id, {0x41, 0x00, 0x00, 0x00, 0x00, 0x00});
        }
        m_proxy->setDevice(m_device);
        EXPECT_TRUE(m_proxy->initialize());
        m_device->requests.clear();
        m_device->timeouts.clear();
        m_log.clear();
    }
    ~Parameter() override { m_proxy->releaseEcus(); }

    void reply(unsigned int id, Bytes const& data) { m_device->answer({0x01, 0x0C}, id, data); }
    void status(IDevice::Status status) { m_device->answer({0x01, 0x0C}, support::FakeDevice::Answer{status, {}}); }

    std::shared_ptr<support::FakeDevice> m_device = std::make_shared<support::FakeDevice>();
    std::shared_ptr<ObdProxy> m_proxy = std::make_shared<ObdProxy>();
    support::LogCapture m_log;
    Probe m_probe;
};

TEST_F(Parameter, SendsItsRequestWithItsTimeout)
{
    reply(0x7E8, {0x41, 0x0C, 0x1A, 0xF8});
    EXPECT_EQ(m_probe.update(m_proxy), UpdateStatus::UpdateOk);
    EXPECT_EQ(m_device->requests, (std::vector<Bytes>{{0x01, 0x0C}}));
    EXPECT_EQ(m_device->timeouts, std::vector<unsigned int>{1500});
    Bytes request;
    m_probe.requestData(request);
    EXPECT_EQ(request, (Bytes{0x01, 0x0C}));
}

TEST_F(Parameter, StatusOfTheDeviceDecides)
{
    status(IDevice::Status::NoResponse);
    EXPECT_EQ(m_probe.update(m_proxy), UpdateStatus::UpdateNoData);
    for (auto const failing : {IDevice::Status::NotSent, IDevice::Status::NotEnabled, IDevice::Status::Unparsed}) {
        status(failing);
        EXPECT_EQ(m_probe.update(m_proxy), UpdateStatus::UpdateFailed);
    }
    EXPECT_TRUE(m_log.lines().empty());
}

TEST_F(Parameter, EmptyMapWithStatusOkFails)
{
    status(IDevice::Status::Ok);
    EXPECT_EQ(m_probe.update(m_proxy), UpdateStatus::UpdateFailed);
}

TEST_F(Parameter, OneGoodModuleIsEnoughAndEachIsOffered)
{
    reply(0x7E8, {0x41, 0x0C, 1});
    reply(0x7E9, {0x41, 0x0C, 2});
    EXPECT_EQ(m_probe.update(m_proxy), UpdateStatus::UpdateOk);
    EXPECT_EQ(m_probe.stored.size(), 2U);
    m_probe.stored.clear();
    reply(0x7E8, {0x41, 0x0D, 1});
    EXPECT_EQ(m_probe.update(m_proxy), UpdateStatus::UpdateOk);
    EXPECT_EQ(m_probe.stored.size(), 1U);
    EXPECT_EQ(m_log.lines(),
              (std::vector<std::string>{"ERROR Signature mismatch", "ERROR Invalid data received for 0x7e8"}));
}

TEST_F(Parameter, TellsOfEachModuleHowTheLastUpdateWent)
{
    auto const verdict = [this](unsigned int id) { return m_probe.verdict(*m_proxy->ecu(id)); };
    reply(0x7E8, {0x41, 0x0C, 1});
    reply(0x7E9, {0x7F, 0x01, 0x22});
    m_probe.update(m_proxy);
    EXPECT_TRUE(m_probe.delivered(*m_proxy->ecu(0x7E8)));
    EXPECT_EQ(verdict(0x7E9), (Verdict{OutcomeKind::Refused, 0x22}));
    EXPECT_EQ(verdict(0x18), Verdict{OutcomeKind::ModuleSilent});

    reply(0x7E9, {0x41, 0x0D, 1});
    m_probe.update(m_proxy);
    EXPECT_EQ(verdict(0x7E9), Verdict{OutcomeKind::Unreadable});

    std::pair<IDevice::Status, OutcomeKind> const cases[] = {
        {IDevice::Status::NoResponse, OutcomeKind::ModuleSilent},
        {IDevice::Status::Unparsed, OutcomeKind::Unreadable},
        {IDevice::Status::NotSent, OutcomeKind::NotConnected},
        {IDevice::Status::NotEnabled, OutcomeKind::NotConnected},
    };
    for (auto const& [deviceStatus, kind] : cases) {
        status(deviceStatus);
        m_probe.update(m_proxy);
        EXPECT_EQ(verdict(0x7E8), Verdict{kind}) << "nothing of the update before counts";
    }
    m_device->enabled = false;
    status(IDevice::Status::Unparsed);
    m_probe.update(m_proxy);
    EXPECT_EQ(verdict(0x7E8), Verdict{OutcomeKind::NotConnected});
}

TEST_F(Parameter, NegativeReplySetsTheCodeAndFails)
{
    reply(0x7E8, {0x7F, 0x01, 0x12});
    EXPECT_EQ(m_probe.update(m_proxy), UpdateStatus::UpdateFailed);
    EXPECT_EQ(m_probe.nack(), 0x12);
    EXPECT_EQ(NackToString(static_cast<Nack>(m_probe.nack())), "Subfunction not supported");
    EXPECT_EQ(m_log.lines(), (std::vector<std::string>{"ERROR ECU with ID 2024 received NACK:  0x7f 0x1 0x12",
                                                       "ERROR Invalid data received for 0x7e8"}));
    EXPECT_TRUE(m_probe.stored.empty());
}

TEST_F(Parameter, CutNegativeReplyHasACodeWithoutAName)
{
    for (Bytes const& cut : {Bytes{0x7F}, Bytes{0x7F, 0x01}}) {
        reply(0x7E8, cut);
        EXPECT_EQ(m_probe.update(m_proxy), UpdateStatus::UpdateFailed);
        EXPECT_EQ(m_probe.nack(), 0x79);
        EXPECT_EQ(NackToString(static_cast<Nack>(m_probe.nack())), "Unknown");
    }
}

TEST_F(Parameter, LastNegativeReplyStandsAndNoLaterPositiveOneResetsIt)
{
    reply(0x18, {0x7F, 0x01, 0x11});
    reply(0x7E8, {0x7F, 0x01, 0x22, 0x00});
    reply(0x7E9, {0x41, 0x0C, 2});
    EXPECT_EQ(m_probe.update(m_proxy), UpdateStatus::UpdateOk);
    EXPECT_EQ(m_probe.nack(), 0x22);
    status(IDevice::Status::NoResponse);
    m_probe.update(m_proxy);
    EXPECT_EQ(m_probe.nack(), 0) << "each update starts afresh";
}

TEST_F(Parameter, EmptyReplyIsASignatureMismatch)
{
    reply(0x7E8, {});
    EXPECT_EQ(m_probe.update(m_proxy), UpdateStatus::UpdateFailed);
    EXPECT_TRUE(m_log.contains("ERROR Signature mismatch"));
    EXPECT_EQ(m_probe.nack(), 0);
}

TEST_F(Parameter, EmptySignatureMatchesEverything)
{
    Probe any((Bytes()));
    reply(0x7E8, {});
    EXPECT_EQ(any.update(m_proxy), UpdateStatus::UpdateOk);
}

TEST_F(Parameter, UnknownModuleBesideAGoodOneIsSkipped)
{
    reply(0x10, {0x41, 0x0C, 1});
    reply(0x18, {0x41, 0x0C, 2});
    EXPECT_EQ(m_probe.update(m_proxy), UpdateStatus::UpdateOk);
    EXPECT_EQ(m_log.lines(), std::vector<std::string>{"ERROR No such ECU: 16"});
    EXPECT_EQ(m_probe.stored.size(), 1U);
}

TEST_F(Parameter, RefusedDataLeaveTheOldValue)
{
    reply(0x7E8, {0x41, 0x0C, 1});
    m_probe.update(m_proxy);
    m_probe.accept = [] { return false; };
    reply(0x7E8, {0x41, 0x0C, 2});
    EXPECT_EQ(m_probe.update(m_proxy), UpdateStatus::UpdateFailed);
    EXPECT_EQ(m_probe.stored[0x7E8], (Bytes{0x41, 0x0C, 1}));
}

TEST_F(Parameter, ExceptionIsDumpedAndRethrown)
{
    reply(0x18, {0x41, 0x0C, 0xFF});
    reply(0x7E8, {0x41, 0x0C, 0x00});
    m_probe.accept = []() -> bool { throw std::out_of_range("beyond"); };
    EXPECT_THROW(m_probe.update(m_proxy), std::out_of_range);
    EXPECT_EQ(m_log.lines(), std::vector<std::string>{
                                 "FATAL Failed ObdParameter::update (request: 0x1 0xc, response from 0x18: 0x41 0xc "
                                 "0xff, response from 0x7e8: 0x41 0xc 0x0)"});
}

TEST_F(Parameter, SaeChecksumLengthIsFoundFromTheLines)
{
    Probe probe({0x49, 0x02});
    Bytes const line7 = {0x49, 0x02, 1, 2, 3, 4, 5};
    Bytes const line8 = {0x49, 0x02, 1, 2, 3, 4, 5, 0xAA};
    auto const lines = [](Bytes const& line, int count) {
        Bytes all;
        for (int i = 0; i < count; ++i) {
            all.insert(all.end(), line.begin(), line.end());
        }
        return all;
    };
    EXPECT_EQ(probe.findSaeChecksumLength(lines(line7, 2)), 0);
    EXPECT_EQ(probe.findSaeChecksumLength(lines(line8, 2)), 1);
    EXPECT_EQ(probe.findSaeChecksumLength(lines(line8, 7)), 1) << "56 bytes fail at 7 first";
    EXPECT_EQ(probe.findSaeChecksumLength(lines(line7, 8)), 0) << "56 bytes fit at 7 first";
    EXPECT_EQ(probe.findSaeChecksumLength(Bytes(10, 0x49)), -1);
    EXPECT_EQ(probe.findSaeChecksumLength(Bytes(14, 0x00)), -1);
    EXPECT_EQ(probe.findSaeChecksumLength(Bytes(16, 0x00)), -1);
    EXPECT_EQ(probe.findSaeChecksumLength({}), -1);
}

TEST_F(Parameter, LinesMustEachBeginWithTheSignature)
{
    Probe probe({0x49, 0x02});
    Bytes lines = {0x49, 0x02, 1, 2, 3, 4, 5, 0x49, 0x02, 1, 2, 3, 4, 5};
    EXPECT_TRUE(probe.verifySaeSignatures(lines, 0));
    lines[8] = 0x03;
    EXPECT_FALSE(probe.verifySaeSignatures(lines, 0));
    EXPECT_FALSE(probe.verifySaeSignatures({0x49}, 0)) << "shorter than the signature";
    EXPECT_TRUE(probe.verifySaeSignatures({0x00, 0x00}, 0)) << "of the signature's length it isn't compared";
    EXPECT_TRUE(probe.verifySaeSignatures({0x49, 0x02, 1, 2, 3, 4, 5, 0xFF, 0xFF}, 0))
        << "the last bytes before the end start no line";
    EXPECT_FALSE(probe.verifySaeSignatures({0x49, 0x02, 1, 2, 3, 4, 5, 0xFF, 0xFF, 0xFF}, 0));
}

TEST_F(Parameter, OneFrameIsTestedByItsPrefix)
{
    Probe probe({0x49, 0x02});
    EXPECT_TRUE(probe.verifySaeSignature({0x49, 0x02, 0xFF}));
    EXPECT_TRUE(probe.verifySaeSignature({0x49, 0x02}));
    EXPECT_FALSE(probe.verifySaeSignature({0x49}));
    EXPECT_FALSE(probe.verifySaeSignature({0x49, 0x03, 0x02}));
}

TEST_F(Parameter, CurrentDataRequestAndReply)
{
    SpeedParameter parameter(ObdMode::CurrentData, 5);
    Bytes request;
    parameter.requestData(request);
    EXPECT_EQ(request, (Bytes{0x01, 0x0C})) << "no frame in service 01";
    auto const ecu = m_proxy->firstEcu();
    EXPECT_TRUE(parameter.setResponseData(ecu, {0x41, 0x0C, 0x1A, 0xF8, 0x33}));
    EXPECT_EQ(parameter.payload, (Bytes{0x1A, 0xF8, 0x33}));
}

TEST_F(Parameter, ReplyOfServiceAndPidAloneHasNoPayload)
{
    SpeedParameter parameter(ObdMode::CurrentData, 0);
    EXPECT_FALSE(parameter.setResponseData(m_proxy->firstEcu(), {0x41, 0x0C}));
    EXPECT_TRUE(m_log.lines().empty()) << "the beginning was right";
}

TEST_F(Parameter, FreezeFrameRequestAndReplyNameTheFrame)
{
    SpeedParameter parameter(ObdMode::FreezeFrame, 0);
    Bytes request;
    parameter.requestData(request);
    EXPECT_EQ(request, (Bytes{0x02, 0x0C, 0x00}));
    auto const ecu = m_proxy->firstEcu();
    EXPECT_FALSE(parameter.setResponseData(ecu, {0x42, 0x0C, 0x01, 0x1A, 0xF8}));
    EXPECT_EQ(m_log.lines(), std::vector<std::string>{"ERROR Signature mismatch"});
    EXPECT_TRUE(parameter.setResponseData(ecu, {0x42, 0x0C, 0x00, 0x1A, 0xF8}));
    EXPECT_EQ(parameter.payload, (Bytes{0x1A, 0xF8}));
    EXPECT_FALSE(parameter.setResponseData(ecu, {0x42, 0x0C, 0x00}));
}

TEST(Nack, EveryCodeHasItsText)
{
    EXPECT_EQ(NackToString(NackAcknowledged), "Acknowledged");
    EXPECT_EQ(NackToString(NackGeneralReject), "General reject");
    EXPECT_EQ(NackToString(NackServiceNotSupported), "Service not supported");
    EXPECT_EQ(NackToString(NackSubfunctionNotSupported), "Subfunction not supported");
    EXPECT_EQ(NackToString(NackBusy), "Busy");
    EXPECT_EQ(NackToString(NackConditionsNotCorrect), "Conditions not correct");
    EXPECT_EQ(NackToString(NackResponsePending), "Response pending");
    for (int code = 0; code < 256; ++code) {
        EXPECT_FALSE(NackToString(static_cast<Nack>(code)).empty());
    }
    EXPECT_EQ(NackToString(static_cast<Nack>(0x31)), "Unknown");
}

TEST(OidText, IsADollarAndTwoUpperCaseDigits)
{
    EXPECT_EQ(OidToString(0x0C), "$0C");
    EXPECT_EQ(OidToString(0xFF), "$FF");
    EXPECT_EQ(OidToString(0x00), "$00");
}

} // namespace
