#include "libvelmora/read/codereader.h"

#include <utility>

namespace velmora {

namespace {

constexpr unsigned int codesLimitMs = 1500;

struct KindRow
{
    unsigned char service;
    std::vector<std::shared_ptr<obd::DtcDataModel>> (obd::ITroubleCodeService::*fetch)();
};

KindRow const& row(CodeKind kind)
{
    static constexpr KindRow rows[] = {
        {0x03, &obd::ITroubleCodeService::fetchConfirmedCodes},
        {0x07, &obd::ITroubleCodeService::fetchPendingCodes},
        {0x0A, &obd::ITroubleCodeService::fetchPermanentCodes},
    };
    return rows[static_cast<int>(kind)];
}

CodeList withoutCodes(CodeKind kind, ServiceReply const& reply, obd::ObdProtocol protocol)
{
    switch (reply.kind) {
    case ServiceReply::Kind::Silent:
        return {kind, CodeList::Answer::Silent, {}, {}};
    case ServiceReply::Kind::Refused:
        return {kind, CodeList::Answer::Refused, reply.reason, {}};
    case ServiceReply::Kind::Positive:
        if (isCodeListReply(reply.bytes, protocol)) {
            return {kind, CodeList::Answer::Read, {}, {}};
        }
        break;
    case ServiceReply::Kind::Foreign:
        break;
    }
    return {kind, CodeList::Answer::Unreadable, {}, {}};
}

} // namespace

bool isCodeListReply(std::vector<unsigned char> const& bytes, obd::ObdProtocol protocol)
{
    if (protocol == obd::ObdProtocolCan11 || protocol == obd::ObdProtocolCan29) {
        return bytes.size() >= 2 && bytes.size() >= 2U + 2U * bytes[1];
    }
    return !bytes.empty() && (bytes.size() % 7 == 0 || bytes.size() % 8 == 0);
}

CodeReader::CodeReader(Session& session)
    : m_session(session), m_service(obd::TroubleCodeServiceBuilder::createTroubleCodeService())
{}

CodeReport CodeReader::read(obd::IEcu const& ecu, std::vector<CodeKind> const& kinds)
{
    m_session.select(ecu);
    CodeReport report;
    auto const lamp = m_service->fetchMilStatus();
    m_session.check();
    if (lamp != nullptr) {
        report.lamp = *lamp == obd::ITroubleCodeService::MilStatus::On;
    }
    for (CodeKind const kind : kinds) {
        report.lists.push_back(readList(ecu, kind));
        m_session.check();
    }
    return report;
}

CodeList CodeReader::readList(obd::IEcu const& ecu, CodeKind kind)
{
    auto const models = (m_service.get()->*row(kind).fetch)();
    if (!models.empty()) {
        return {kind, CodeList::Answer::Read, {}, groupByCode(models)};
    }
    m_session.check();
    return withoutCodes(kind, reply(ecu, kind), ecu.protocol());
}

ServiceReply CodeReader::reply(obd::IEcu const& ecu, CodeKind kind)
{
    auto found = m_replies.find(kind);
    if (found == m_replies.end()) {
        found = m_replies.emplace(kind, ServiceReplies(*m_session.proxy(), row(kind).service, codesLimitMs)).first;
    }
    return found->second.of(ecu.id());
}

} // namespace velmora
