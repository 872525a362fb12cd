#include <gtest/gtest.h>
#include <sys/mman.h>
#include <unistd.h>

#include "desktop/system/SmallMemory.h"

namespace nimbo {
namespace {

/// Fills half a megabyte of stack; the address of a page in the middle of it.
[[gnu::noinline]] std::uintptr_t pageOfDeepCall() {
  volatile char bytes[512 * 1024];
  for (volatile char& byte : bytes) byte = 1;
  const auto size = static_cast<std::uintptr_t>(sysconf(_SC_PAGESIZE));
  return reinterpret_cast<std::uintptr_t>(&bytes[sizeof bytes / 2]) / size * size;
}

bool isResident(std::uintptr_t page) {
  unsigned char state = 0;
  EXPECT_EQ(mincore(reinterpret_cast<void*>(page), 1, &state), 0);
  return (state & 1) != 0;
}

TEST(SmallMemory, GivesBackTheStackOfCallsThatHaveEnded) {
  volatile int local = 7;
  const std::uintptr_t page = pageOfDeepCall();
  ASSERT_TRUE(isResident(page));
  giveBackStack();
  EXPECT_FALSE(isResident(page));
  EXPECT_EQ(local, 7);
}

}  // namespace
}  // namespace nimbo
