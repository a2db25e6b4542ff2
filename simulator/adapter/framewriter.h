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
    FrameWriter(Protocol const& protocol, Settings const& settings, Quirks const& quirks);

    /// The lines for one frame, each ended by CR.
    std::string lines(Frame const& frame) const;

private:
    std::string canLines(Frame const& frame) const;
    std::string formattedCan(Frame const& whole) const;
    std::string serialLine(Frame const& frame) const;
    std::string header(Frame const& frame) const;
    std::string text(Bytes const& bytes) const;
    Bytes withoutPadding(Bytes const& data) const;
    bool headersShown() const;

    Protocol const& m_protocol;
    Settings const& m_settings;
    Quirks const& m_quirks;
};

} // namespace obdsim
