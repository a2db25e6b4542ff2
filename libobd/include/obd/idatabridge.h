#pragma once

#include <vector>

namespace obd {

/// The application's view of the byte channel: its own reader and writer loops move the bytes between this and the
/// port.
class IDataBridge
{
public:
    virtual ~IDataBridge() = default;

    /// Marks the channel dead, for good. True for the call that made the change. A waiting get or receive isn't woken;
    /// the library looks at the mark at least every 250 ms.
    virtual bool invalidate() = 0;

    /// Takes everything queued for the adapter, waiting up to 100 ms for it. True if out holds bytes afterwards: pass
    /// an empty vector, since one that is full on an idle channel comes back as it was, with true.
    virtual bool get(std::vector<unsigned char>& out) = 0;

    /// Delivers bytes from the adapter, in any pieces. Only one thread may call it.
    virtual void set(std::vector<unsigned char> const& bytes) = 0;
};

} // namespace obd
