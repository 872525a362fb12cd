#pragma once

namespace nimbo {

/// Keeps the resident memory of a program that runs all day small; for the beginning of `main`.
///
/// One heap for all threads, since few of them allocate much. What is as large as a feed is given back to the system
/// when it is freed: by default glibc moves later ones of that size into the heap (docs/performance.md). Source:
/// https://man7.org/linux/man-pages/man3/mallopt.3.html
void keepHeapSmall();

/// Gives back to the system what deeper calls on this thread took of its stack and have left, such as
/// GTK, which reads its theme recursively.
void giveBackStack();

}  // namespace nimbo
