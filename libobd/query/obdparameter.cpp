#include "libobd/bytes/bytes.h"

#include <common/logrecord.h>
#include <common/tracestream.h>
#include <obd/iobdproxy.h>
#include <obd/nack.h>
#include <obd/obdparameter.h>

namespace obd {
namespace {

constexpr int cutNack = 0x79; // a negative reply too short to hold its code
constexpr std::size_t nackCodePosition = 2;
constexpr std::size_t saeLineLength = 7; // data bytes of one ISO 9141-2 or J1850 line

std::string dump(std::vector<unsigned char> const& request, ResponseMap const& responses)
{
    std::string text = "request:" + hexDump(request);
    for (auto const& [id, data] : responses) {
        text += ", response from 0x" + lowerHex(id) + ":" + hexDump(data);
    }
    return text;
}

bool isNegative(std::vector<unsigned char> const& data)
{
    return !data.empty() && data.front() == negativeReply;
}

int nackCode(std::vector<unsigned char> const& data)
{
    return data.size() > nackCodePosition ? data[nackCodePosition] : cutNack;
}

// What an exchange means for a module of which it brought nothing.
OutcomeKind withoutReply(IDevice::Status status, AdapterNote note, IObdProxy& proxy)
{
    switch (status) {
    case IDevice::Status::Ok:
        return OutcomeKind::ModuleSilent;
    case IDevice::Status::NoResponse: // where the adapter has more to tell than silence, it is none of the module
        return note == AdapterNote::None ? OutcomeKind::ModuleSilent : OutcomeKind::Unreadable;
    case IDevice::Status::Unparsed: // so it also is without a link
        return proxy.isConnected() ? OutcomeKind::Unreadable : OutcomeKind::NotConnected;
    default:
        return OutcomeKind::NotConnected;
    }
}

} // namespace

IQuery::UpdateStatus ObdParameter::update(std::shared_ptr<IObdProxy> const& proxy)
{
    m_nack = 0;
    m_verdicts.clear();
    m_others = OutcomeKind::Unreadable; // of what throws on the way
    std::vector<unsigned char> request;
    ResponseMap responses;
    try {
        getRequestData(request);
        AdapterNote note{};
        IDevice::Status const status = proxy->executeNoted(request, responses, timeout(), note);
        m_others = withoutReply(status, note, *proxy);
        if (status == IDevice::Status::NoResponse) {
            return UpdateStatus::UpdateNoData;
        }
        if (status != IDevice::Status::Ok) {
            return UpdateStatus::UpdateFailed;
        }
        return distribute(proxy, responses);
    } catch (...) {
        TERVEX_LOG(Fatal) << "Failed ObdParameter::update (" << dump(request, responses) << ")";
        throw;
    }
}

IQuery::UpdateStatus ObdParameter::distribute(std::shared_ptr<IObdProxy> const& proxy, ResponseMap const& responses)
{
    UpdateStatus result = UpdateStatus::UpdateFailed;
    for (auto const& [id, data] : responses) {
        std::shared_ptr<IEcu> const ecu = proxy->ecu(id);
        if (ecu == nullptr) {
            TERVEX_LOG(Error) << "No such ECU: " << id;
        } else if (Verdict const verdict = judge(ecu, data); verdict.kind == OutcomeKind::Answered) {
            result = UpdateStatus::UpdateOk;
        } else {
            TERVEX_LOG(Error) << "Invalid data received for 0x" << lowerHex(id);
        }
    }
    return result;
}

Verdict ObdParameter::judge(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data)
{
    Verdict& verdict = m_verdicts[ecu->id()];
    verdict = {OutcomeKind::Unreadable}; // also if the reading throws
    if (setResponseData(ecu, data)) {
        verdict = {OutcomeKind::Answered};
    } else if (isNegative(data)) {
        verdict = {OutcomeKind::Refused, nackCode(data)};
    }
    return verdict;
}

Verdict ObdParameter::verdict(IEcu const& ecu) const
{
    auto const found = m_verdicts.find(ecu.id());
    return found != m_verdicts.end() ? found->second : Verdict{m_others};
}

unsigned int ObdParameter::timeout() const
{
    return 1500;
}

void ObdParameter::clear() {}

void ObdParameter::requestData(std::vector<unsigned char>& data) const
{
    getRequestData(data);
}

bool ObdParameter::setResponseData(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data)
{
    if (isNegative(data)) {
        setNack(ecu, data);
        return false;
    }
    if (!verifySaeSignature(data)) {
        TERVEX_LOG(Error) << "Signature mismatch";
        return false;
    }
    return fromBytes(ecu, data);
}

int ObdParameter::nack() const
{
    return m_nack;
}

void ObdParameter::setNack(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data)
{
    TERVEX_LOG(Error) << "ECU with ID " << ecu->id() << " received NACK: " << hexDump(data);
    m_nack = nackCode(data);
}

int ObdParameter::findSaeChecksumLength(std::vector<unsigned char> const& data) const
{
    if (data.size() % saeLineLength == 0) {
        tervex::TraceStream << "Guess no checksum in use";
        if (verifySaeSignatures(data, 0)) {
            return 0;
        }
    }
    if (data.size() % (saeLineLength + 1) != 0) {
        return -1;
    }
    tervex::TraceStream << "Guess checksum in use";
    return verifySaeSignatures(data, 1) ? 1 : -1;
}

bool ObdParameter::verifySaeSignatures(std::vector<unsigned char> const& data, unsigned int checksumLength) const
{
    std::vector<unsigned char> signature;
    getSignature(signature);
    if (data.size() < signature.size()) {
        return false;
    }
    if (data.size() == signature.size()) {
        return true;
    }
    std::size_t const end = data.size() - signature.size();
    for (std::size_t position = 0; position < end; position += saeLineLength + checksumLength) {
        if (!startsWith(data, signature, position)) {
            return false;
        }
    }
    return true;
}

bool ObdParameter::verifySaeSignature(std::vector<unsigned char> const& data) const
{
    std::vector<unsigned char> signature;
    getSignature(signature);
    return startsWith(data, signature, 0);
}

} // namespace obd
