#include "desktop/system/SmallMemory.h"

#include <malloc.h>
#include <pthread.h>
#include <sys/mman.h>
#include <unistd.h>

#include <cstdint>

namespace nimbo {

void keepHeapSmall() {
  constexpr int kMapped = 128 * 1024;  // bytes; the default, which no longer grows once it is set
  mallopt(M_ARENA_MAX, 1);
  mallopt(M_MMAP_THRESHOLD, kMapped);
}

void giveBackHeapSoon(RunLoop& runLoop, std::shared_ptr<Timer>& timer) {
  if (!timer || !timer->isValid()) timer = runLoop.scheduleTimer(1, false, [](Timer&) { malloc_trim(0); });
}

void giveBackStack() {
  pthread_attr_t attributes;
  if (pthread_getattr_np(pthread_self(), &attributes) != 0) return;
  void* lowest = nullptr;
  std::size_t size = 0;
  pthread_attr_getstack(&attributes, &lowest, &size);
  pthread_attr_destroy(&attributes);
  // The stack grows downwards; a page below this frame is kept for what is called from here.
  const auto page = static_cast<std::uintptr_t>(sysconf(_SC_PAGESIZE));
  const std::uintptr_t used = reinterpret_cast<std::uintptr_t>(__builtin_frame_address(0)) / page * page - page;
  const auto begin = reinterpret_cast<std::uintptr_t>(lowest);
  // Of the main thread's stack the lower part is not mapped yet: that is answered as an error and does no harm.
  if (begin < used) (void)madvise(lowest, used - begin, MADV_DONTNEED);
}

void populate(void* memory, std::size_t size) {
  constexpr std::size_t kWorthACall = 1 << 20;
  if (size < kWorthACall) return;
  const auto page = static_cast<std::uintptr_t>(sysconf(_SC_PAGESIZE));
  const auto begin = (reinterpret_cast<std::uintptr_t>(memory) + page - 1) / page * page;
  const auto end = (reinterpret_cast<std::uintptr_t>(memory) + size) / page * page;
  // Since Linux 5.14; before, the pages come one by one.
  (void)madvise(reinterpret_cast<void*>(begin), end - begin, MADV_POPULATE_WRITE);
}

}  // namespace nimbo
