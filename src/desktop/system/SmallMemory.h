#pragma once

#include <cstddef>
#include <memory>

#include "platform/RunLoop.h"

namespace nimbo {

/// Keeps the resident memory of a program that runs all day small; for the beginning of `main`.
///
/// One heap for all threads, since few of them allocate much. What is as large as a feed is given back to the system
/// when it is freed: by default glibc moves later ones of that size into the heap (docs/performance.md). Source:
/// https://man7.org/linux/man-pages/man3/mallopt.3.html
void keepHeapSmall();

/// Gives back to the system the heap's pages that hold nothing, a second from now, when what a change of the rows took
/// is freed. Sets the caller's `timer`, which may be null; nothing while it is still to fire.
void giveBackHeapSoon(RunLoop& runLoop, std::shared_ptr<Timer>& timer);

/// Gives back to the system what deeper calls on this thread took of its stack and have left, such as
/// GTK, which reads its theme recursively.
void giveBackStack();

/// Has the system give the pages of large memory that is about to be written at once: half of what a fault for each
/// takes (docs/performance.md).
void populate(void* memory, std::size_t size);

}  // namespace nimbo
