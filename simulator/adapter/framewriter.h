#pragma once

#include "simulator/adapter/quirk.h"
#include "simulator/adapter/settings.h"
#include "simulator/bus/frame.h"

namespace obdsim {

/// Prints frames in the form that the host has chosen: header, blanks, PCI bytes.
class FrameWriter
{
public:
    /// All three must outlive the writer.
    FrameWriter(const Protocol& protocol, const Settings& settings, const Quirks& quirks);

    /// The lines for one frame, each ended by CR.
    std::string lines(const Frame& frame) const;

private:
    std::string canLines(const Frame& frame) const;
    std::string formattedCan(const Frame& frame) const;
    std::string serialLine(const Frame& frame) const;
    std::string header(const Frame& frame) const;
    std::string text(const Bytes& bytes) const;
    Bytes withoutPadding(const Bytes& data) const;
    bool headersShown() const;

    const Protocol& m_protocol;
    const Settings& m_settings;
    const Quirks& m_quirks;
};

} // namespace obdsim
