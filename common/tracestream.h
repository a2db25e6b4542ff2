#pragma once

#include <ios>

namespace tervex {

// A stream without a sink: what is written there is vocabulary for the reader of the code and reaches no log. It holds
// no state, so all threads may share it.
class NullStream
{
public:
    template <typename T>
    NullStream const& operator<<(T const& /*value*/) const
    {
        return *this;
    }
    NullStream const& operator<<(std::ios_base& (* /*manipulator*/)(std::ios_base&)) const { return *this; }
};

inline constexpr NullStream TraceStream{};

} // namespace tervex
