// Writes a made-up feed for the benchmarks of whole processes: nimbo-bench-feed FOLDER

#include <chrono>
#include <cstdio>
#include <filesystem>
#include <fstream>

#include "support/MadeUpFeed.h"

namespace {

void write(const std::filesystem::path& path, const std::string& bytes) {
  std::ofstream(path, std::ios::binary).write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 2) {
    std::fprintf(stderr, "usage: nimbo-bench-feed FOLDER\n");
    return 2;
  }
  const std::filesystem::path folder = argv[1];
  std::filesystem::create_directories(folder);
  write(folder / "routes.txt", nimbo::madeUpRoutes());
  write(folder / "agency.txt", nimbo::madeUpAgencies());
  const auto now = std::chrono::system_clock::now().time_since_epoch();
  write(folder / "alerts.pb",
        nimbo::madeUpAlerts(std::uint64_t(std::chrono::duration_cast<std::chrono::seconds>(now).count())));
}
