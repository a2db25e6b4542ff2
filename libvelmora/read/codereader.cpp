#include "libvelmora/read/codereader.h"

#include "libvelmora/read/topicanswer.h"

namespace velmora {

namespace {

using Codes = obd::Outcome<std::vector<std::shared_ptr<obd::DtcDataModel>>>;

Codes ask(obd::ITroubleCodeService& service, CodeKind kind)
{
    static constexpr Codes (obd::ITroubleCodeService::*operations[])() = {
        &obd::ITroubleCodeService::askConfirmedCodes,
        &obd::ITroubleCodeService::askPendingCodes,
        &obd::ITroubleCodeService::askPermanentCodes,
    };
    return (service.*operations[static_cast<int>(kind)])();
}

} // namespace

CodeList toCodeList(CodeKind kind, Codes const& outcome)
{
    switch (toAnswer(outcome)) {
    case TopicAnswer::Read:
        return {kind, CodeList::Answer::Read, {}, groupByCode(outcome.value)};
    case TopicAnswer::Refused:
        return {kind, CodeList::Answer::Refused, refusalText(outcome.code), {}};
    case TopicAnswer::NotOffered: // which for a list of codes a module tells by its refusal
        return {kind, CodeList::Answer::Refused, refusalText(outcome.code), {}, false};
    case TopicAnswer::Unreadable:
        return {kind, CodeList::Answer::Unreadable, {}, {}};
    case TopicAnswer::Silent:
        return {kind, CodeList::Answer::Silent, {}, {}};
    }
    return {kind, CodeList::Answer::Silent, {}, {}};
}

CodeReader::CodeReader(Session& session)
    : m_session(session), m_service(obd::TroubleCodeServiceBuilder::createTroubleCodeService())
{}

CodeReport CodeReader::read(obd::IEcu const& ecu, std::vector<CodeKind> const& kinds)
{
    m_session.select(ecu);
    CodeReport report;
    auto const lamp = m_service->askMilStatus();
    m_session.check();
    report.lampAnswer = toAnswer(lamp);
    if (lamp.value != nullptr) {
        report.lamp = *lamp.value == obd::ITroubleCodeService::MilStatus::On;
    }
    for (CodeKind const kind : kinds) {
        report.lists.push_back(toCodeList(kind, ask(*m_service, kind)));
        m_session.check();
    }
    return report;
}

} // namespace velmora
