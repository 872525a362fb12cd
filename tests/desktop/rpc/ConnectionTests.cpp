#include <gmock/gmock.h>
#include <malloc.h>
#include <sys/socket.h>
#include <unistd.h>

#include "desktop/raii/FileDescriptor.h"
#include "desktop/rpc/JSONRPCConnection.h"

namespace nimbo {
namespace {

TEST(JSONRPCConnection, SkipsALineBeyondTheBoundWithoutKeepingIt) {
  int both[2];
  ASSERT_EQ(::socketpair(AF_UNIX, SOCK_STREAM | SOCK_NONBLOCK, 0, both), 0);
  const FileDescriptor near(both[0]), far(both[1]);
  GLibRunLoop loop;
  JSONRPCConnection connection(loop, near.get(), near.get());
  std::vector<std::string> problems;
  bool isPinged = false;
  connection.setMalformedHandler([&](const std::string& problem) { problems.push_back(problem); });
  connection.setHandler("ping", [&](const nlohmann::json&, const JSONRPCResponder&) { isPinged = true; });
  connection.start();
  const auto send = [&](std::string_view bytes) {
    while (!bytes.empty()) {
      if (const ssize_t count = ::write(far.get(), bytes.data(), bytes.size()); count > 0)
        bytes.remove_prefix(static_cast<std::size_t>(count));
      loop.runOnce();
    }
  };

  constexpr std::size_t kSent = 16 * JSONRPCConnection::kMaximumLine;
  const auto usedMemory = [] { return mallinfo2().uordblks + mallinfo2().hblkhd; };
  const std::string piece(64 * 1024, 'x');
  const std::size_t before = usedMemory();
  for (std::size_t sent = 0; sent < kSent; sent += piece.size()) send(piece);
  EXPECT_LT(usedMemory(), before + kSent / 4);
  EXPECT_THAT(problems, testing::ElementsAre("a line is longer than 4194304 bytes")) << "before its end, and once";

  send("\n{\"jsonrpc\":\"2.0\",\"method\":\"ping\"}\n");
  while (!isPinged) loop.runOnce();
}

}  // namespace
}  // namespace nimbo
