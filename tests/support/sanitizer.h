#pragma once

namespace testsupport {

// Whether ThreadSanitizer watches, which makes a program several times slower. g++ and clang tell it each in its own
// way.
#if defined(__SANITIZE_THREAD__)
inline constexpr bool underThreadSanitizer = true;
#elif defined(__has_feature)
inline constexpr bool underThreadSanitizer = __has_feature(thread_sanitizer);
#else
inline constexpr bool underThreadSanitizer = false;
#endif

} // namespace testsupport
