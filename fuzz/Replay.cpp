// In builds without libFuzzer: gives a target the inputs of the folder that is named.

#include <filesystem>
#include <fstream>
#include <iterator>
#include <vector>

#include "Fuzz.h"

int main(int, char** argv) {
  std::size_t count = 0;
  for (const auto& file : std::filesystem::directory_iterator(argv[1])) {
    std::printf("%s\n", file.path().c_str());
    std::fflush(stdout);
    std::ifstream stream(file.path(), std::ios::binary);
    const std::vector<char> bytes{std::istreambuf_iterator<char>(stream), {}};
    nimbo::LLVMFuzzerTestOneInput(reinterpret_cast<const std::uint8_t*>(bytes.data()), bytes.size());
    ++count;
  }
  return count == 0;
}
