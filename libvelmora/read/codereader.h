#pragma once

#include "libvelmora/report/codereport.h"
#include "libvelmora/session/session.h"

#include <obd/iecu.h>
#include <obd/itroublecodeservice.h>

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
    Session& m_session;
    std::shared_ptr<obd::ITroubleCodeService> m_service;
};

// A list of codes with how asking for it went.
CodeList toCodeList(CodeKind kind, obd::Outcome<std::vector<std::shared_ptr<obd::DtcDataModel>>> const& outcome);

} // namespace velmora
