#pragma once

#include <velmora/error.h>

#include <exception>
#include <future>
#include <optional>
#include <string>
#include <type_traits>
#include <utility>
#include <variant>
#include <vector>

namespace velmora {

// What a function gave or threw on another thread. An Error is made anew for the one who asked: neither thread then
// frees what the other may still read.
template <typename Result>
class ThreadAnswer
{
public:
    // On the other thread.
    template <typename Function>
    void run(Function const& function)
    {
        try {
            if constexpr (std::is_void_v<Result>) {
                function();
                m_value.emplace();
            } else {
                m_value.emplace(function());
            }
        } catch (Error const& error) {
            m_error.emplace(Told{error.kind(), error.what(), error.hints()});
        } catch (...) {
            m_other = std::current_exception();
        }
        m_done.set_value();
    }

    // Waits for the other thread, and gives or throws what the function did. Once only.
    Result get()
    {
        m_done.get_future().get();
        if (m_error) {
            throw Error(m_error->kind, m_error->what, std::move(m_error->hints));
        }
        if (m_other) {
            std::rethrow_exception(std::exchange(m_other, nullptr));
        }
        if constexpr (!std::is_void_v<Result>) {
            return std::move(*m_value);
        }
    }

private:
    using Value = std::conditional_t<std::is_void_v<Result>, std::monostate, Result>;

    struct Told
    {
        ErrorKind kind;
        std::string what;
        std::vector<std::string> hints;
    };

    std::promise<void> m_done;
    std::optional<Value> m_value;
    std::optional<Told> m_error;
    std::exception_ptr m_other;
};

} // namespace velmora
