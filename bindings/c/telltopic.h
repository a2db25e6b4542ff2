#pragma once

#include "bindings/c/cface.h"

#include <velmora/topics.h>

#include <cstdint>
#include <functional>
#include <optional>

namespace velmora::cface {

// The numbers that velmora.h has for them.
std::uint32_t numberOf(TopicAnswer answer);
std::uint32_t numberOf(CodeList const& list);
std::uint32_t numberOf(std::optional<bool> told);
std::uint32_t numberOf(ReadinessStatus status);

// The struct with its size and the module that it is about.
template <typename Plain, typename Report>
Plain begun(ModuleTopic<Report> const& module)
{
    Plain plain{};
    plain.size = sizeof(plain);
    plain.module_name = module.name.c_str();
    plain.module = module.id;
    return plain;
}

// What a function of the car gives, item by item, once all of it has been read.
template <typename Read, typename Tell, typename Function>
int tellEach(velmora_car* car, Read read, Tell const& tell, Function fn, void* user, velmora_error** error)
{
    return guarded(error, [&] {
        require(car, "car");
        require(reinterpret_cast<void const*>(fn), "fn");
        for (auto const& item : std::invoke(read, *car->car)) {
            tell(item, fn, user);
        }
    });
}

} // namespace velmora::cface
