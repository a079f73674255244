#pragma once
// The one door from the public API into the core's process-wide state.
//
// The core keeps fonts, fallback families, locale lists and the text instance
// registry per process, and its font store is not safe to use from several
// threads at once. Every public call that reaches the core holds this lock
// for as long as it works there, so the API is safe from any thread; calls
// simply take turns. When the core's shared state becomes safe for
// concurrent renders, narrowing this lock is the only change the API needs.

#include <mutex>

namespace glimmer::detail {

[[nodiscard]] std::unique_lock<std::mutex> LockCore();

// Hands the system's font families to the core's font store, once per
// process, as fallbacks for characters a text's own font lacks. Call with the
// lock held.
void EnsureSystemFonts();

}  // namespace glimmer::detail
