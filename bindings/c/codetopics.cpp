// Trouble codes: what is stored, clearing, and what a code means.

#include "bindings/c/telltopic.h"
#include "libvelmora/report/troublecode.h"

#include <velmora/catalogue.h>

namespace velmora::cface {

namespace {

void tellCodes(ModuleTopic<CodeReport> const& module, velmora_code_fn fn, void* user)
{
    auto plain = begun<velmora_code>(module);
    plain.lamp = numberOf(module.report.lamp);
    for (CodeList const& list : module.report.lists) {
        plain.kind = static_cast<std::uint32_t>(list.kind);
        plain.answer = numberOf(list);
        plain.reason = list.reason.c_str();
        plain.code = plain.text = nullptr;
        if (list.codes.empty()) {
            fn(&plain, user);
        }
        for (TroubleCode const& code : list.codes) {
            std::string const text = meaningText(code);
            plain.code = code.code.c_str();
            plain.text = text.c_str();
            fn(&plain, user);
        }
    }
}

void tellCleared(ModuleTopic<ClearReport> const& module, velmora_cleared_fn fn, void* user)
{
    auto plain = begun<velmora_cleared>(module);
    plain.reason = module.report.reason.c_str();
    plain.result = static_cast<std::uint32_t>(module.report.result);
    fn(&plain, user);
}

} // namespace

} // namespace velmora::cface

using namespace velmora;

int velmora_car_codes(velmora_car* car, velmora_code_fn fn, void* user, velmora_error** error)
{
    return cface::tellEach(
        car, [](Car& asked) { return asked.codeReports(); }, cface::tellCodes, fn, user, error);
}

int velmora_car_clear(velmora_car* car, uint32_t flags, velmora_cleared_fn fn, void* user, velmora_error** error)
{
    if (flags != VELMORA_CLEAR_ERASES_READINESS) {
        return cface::fail(error, VELMORA_WRONG_USE, "Clearing also erases readiness and freeze frames",
                           {"pass VELMORA_CLEAR_ERASES_READINESS if that is meant"});
    }
    return cface::tellEach(car, &Car::clearCodes, cface::tellCleared, fn, user, error);
}

int velmora_catalogue_find(char const* code, velmora_meaning_fn fn, void* user, velmora_error** error)
{
    return cface::guarded(error, [&] {
        cface::require(code, "code");
        cface::require(reinterpret_cast<void const*>(fn), "fn");
        TroubleCode const found = explain(code);
        for (TroubleCode::Meaning const& meaning : found.meanings) {
            velmora_meaning const plain{sizeof(plain), found.code.c_str(), meaning.maker.c_str(), meaning.text.c_str(),
                                        found.system.c_str()};
            fn(&plain, user);
        }
    });
}
