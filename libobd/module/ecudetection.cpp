// How an Ecu learns what its control module can do.

#include "libobd/bytes/bytes.h"
#include "libobd/module/ecu.h"
#include "libobd/parameters/supportedoids.h"

#include <common/logrecord.h>
#include <common/tracestream.h>
#include <obd/iobdproxy.h>

#include <functional>

namespace obd {
namespace {

constexpr unsigned char noFrame = 0; // of the services that have no frames

} // namespace

bool Ecu::init(unsigned int index)
{
    if (!detectConfiguration(ObdMode::CurrentData, 0)) {
        return false;
    }
    // The sequence is long on a slow bus: a lost link has to end it early.
    std::function<void()> const steps[] = {
        [this] { detectModuleFacts(); },
        [this] { detectConfiguration(ObdMode::MonitorTests, 0); },
        [this] { detectConfiguration(ObdMode::SystemControl, 0); },
        [this] { detectConfiguration(ObdMode::VehicleInformation, 0); },
        [this] { detectStandard(); },
        [this] {
            detectOxygenSensors();
            setFuelTrimByteUsage();
        },
        [this] { detectMode05Configuration(); },
        [this, index] { detectEcuName(index); },
    };
    for (std::function<void()> const& step : steps) {
        if (m_proxy->isConnected()) {
            step();
        }
    }
    return true;
}

std::unique_ptr<SupportedOids> Ecu::getOidParameter(ObdMode mode, unsigned char first, unsigned char frame) const
{
    switch (mode) {
    case ObdMode::CurrentData:
        return std::make_unique<Service01Oids>(first);
    case ObdMode::FreezeFrame:
        return std::make_unique<Service02Oids>(first, frame);
    case ObdMode::MonitorTests:
        return std::make_unique<Service06Oids>(first);
    case ObdMode::SystemControl:
        return std::make_unique<Service08Oids>(first, m_protocol);
    case ObdMode::VehicleInformation:
        return std::make_unique<Service09Oids>(first);
    default:
        return nullptr;
    }
}

// The ranges are chained: each tells in its last bit whether the next one exists.
bool Ecu::detectConfiguration(ObdMode mode, unsigned char frame)
{
    bool result = false;
    {
        std::lock_guard const lock(m_mutex);
        m_detections.erase({mode, frame});
    }
    for (unsigned int base = 0; base <= lastRange && hasOid(mode, static_cast<unsigned char>(base), frame);
         base += rangeSize) {
        std::unique_ptr<SupportedOids> const query = getOidParameter(mode, static_cast<unsigned char>(base), frame);
        if (query == nullptr) {
            continue;
        }
        bool const updated = query->update(m_proxy) == IQuery::UpdateStatus::UpdateOk;
        setDetection(mode, frame, query->verdict(*this));
        if (!updated) {
            TERVEX_LOG(Fatal) << "Failed to get supported 0" << static_cast<int>(mode) << " IDs 0x"
                              << lowerHex(base + 1) << " - 0x" << lowerHex(base + rangeSize) << " for ECU 0x"
                              << lowerHex(m_id) << " frame 0x" << lowerHex(frame);
            break;
        }
        std::vector<unsigned char> found = query->oids(*this);
        for (unsigned char& id : found) {
            id = static_cast<unsigned char>(id + base); // the last of all, 0x100, wraps to 0
        }
        addSupportedOids(mode, frame, found);
        result = true;
    }
    logSupportedPids(mode, frame);
    return result;
}

void Ecu::setDetection(ObdMode mode, unsigned char frame, Verdict const& verdict)
{
    std::lock_guard const lock(m_mutex);
    Verdict& detection = m_detections[{mode, frame}];
    if (detection.kind == OutcomeKind::Answered) {
        detection = verdict;
    }
}

Verdict Ecu::detection(ObdMode mode, unsigned char frame) const
{
    std::lock_guard const lock(m_mutex);
    auto const found = m_detections.find({mode, mode == ObdMode::FreezeFrame ? frame : noFrame});
    return found != m_detections.end() ? found->second : Verdict{OutcomeKind::NotOffered};
}

bool Ecu::detectFreezeFrameConfiguration(unsigned char frame)
{
    tervex::TraceStream << "detectFreezeFrameConfiguration #" << static_cast<unsigned int>(frame);
    {
        std::lock_guard const lock(m_mutex);
        if (m_mode02Oids.contains(frame)) {
            tervex::TraceStream << "Configuration already detected";
            return true;
        }
        m_mode02Oids[frame] = std::make_shared<OidSet>(1, static_cast<unsigned char>(0));
    }
    bool const detected = detectConfiguration(ObdMode::FreezeFrame, frame);
    if (!detected) {
        TERVEX_LOG(Error) << "Failed to detect configuration -> remove frame details";
        std::lock_guard const lock(m_mutex);
        m_mode02Oids.erase(frame);
    }
    return detected;
}

} // namespace obd
