#pragma once

#include "libvelmora/read/servicereplies.h"
#include "libvelmora/report/codereport.h"
#include "libvelmora/session/session.h"

#include <obd/iecu.h>
#include <obd/itroublecodeservice.h>

#include <map>
#include <memory>

namespace velmora {

// Reads lamp and codes of one control module after another. Selects each as the library's current one. Must die before
// the session.
class CodeReader
{
public:
    explicit CodeReader(Session& session);

    CodeReport read(obd::IEcu const& ecu, std::vector<CodeKind> const& kinds);

private:
    CodeList readList(obd::IEcu const& ecu, CodeKind kind);
    ServiceReply reply(obd::IEcu const& ecu, CodeKind kind);

    Session& m_session;
    std::shared_ptr<obd::ITroubleCodeService> m_service;
    std::map<CodeKind, ServiceReplies> m_replies; // asked once for all modules
};

// Whether a positive reply to a service that lists codes has a shape that can be decoded; what a list without codes
// leaves open. On CAN the number of codes stands behind the service byte; legacy buses send lines of seven bytes, some
// with a checksum.
bool isCodeListReply(std::vector<unsigned char> const& bytes, obd::ObdProtocol protocol);

} // namespace velmora
