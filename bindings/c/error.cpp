#include "bindings/c/cface.h"

#include <velmora/error.h>

#include <cstdlib>
#include <exception>

namespace velmora::cface {

namespace {

// Stands for an error that there was no memory to tell.
velmora_error& outOfMemory()
{
    static velmora_error error{VELMORA_FAILED, "out of memory", {}}; // short enough to need no memory
    return error;
}

} // namespace

int fail(velmora_error** error, int code, char const* text, std::vector<std::string> const& hints) noexcept
{
    if (error != nullptr) {
        try {
            *error = new velmora_error{code, text, hints};
        } catch (...) {
            *error = &outOfMemory();
        }
    }
    return code;
}

int failCaught(velmora_error** error) noexcept
{
    try {
        throw;
    } catch (Error const& problem) {
        return fail(error, static_cast<int>(problem.kind()), problem.what(), problem.hints());
    } catch (std::bad_alloc const&) {
        if (error != nullptr) {
            *error = &outOfMemory();
        }
        return VELMORA_FAILED;
    } catch (std::exception const& problem) {
        return fail(error, VELMORA_FAILED, problem.what(), {});
    } catch (...) {
        return fail(error, VELMORA_FAILED, "unknown failure", {});
    }
}

void require(void const* pointer, char const* name)
{
    if (pointer == nullptr) {
        throw Error(ErrorKind::WrongUse, std::string(name) + " must not be NULL");
    }
}

} // namespace velmora::cface

int velmora_error_code(velmora_error const* error)
{
    return error != nullptr ? error->code : VELMORA_OK;
}

char const* velmora_error_message(velmora_error const* error)
{
    return error != nullptr ? error->text.c_str() : "";
}

size_t velmora_error_hint_count(velmora_error const* error)
{
    return error != nullptr ? error->hints.size() : 0;
}

char const* velmora_error_hint(velmora_error const* error, size_t index)
{
    return index < velmora_error_hint_count(error) ? error->hints[index].c_str() : nullptr;
}

void velmora_error_free(velmora_error* error)
{
    if (error != &velmora::cface::outOfMemory()) {
        delete error;
    }
}

void velmora_free(void* memory)
{
    std::free(memory);
}
