#pragma once

namespace tervex {

/// What an application derives its observer of T through. Adds nothing: T's operations are called straight on it.
template <typename T>
class Observer : public T
{};

} // namespace tervex
