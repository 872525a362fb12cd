#include "desktop/archive/Bzip2.h"

#include <bzlib.h>

#include <algorithm>
#include <limits>

namespace nimbo {

namespace {

constexpr int kSmallestBlockSize = 1;  // in 100,000 bytes

/// The greatest input or output that libbz2's counters take.
constexpr std::size_t kMaximumCount = std::numeric_limits<unsigned>::max() - 1024;

/// A decompression that libbz2 has memory for.
class Decompression {
 public:
  Decompression() : _status(BZ2_bzDecompressInit(&stream, 0, 0)) {}
  ~Decompression() {
    if (_status == BZ_OK) BZ2_bzDecompressEnd(&stream);
  }
  Decompression(const Decompression&) = delete;
  Decompression& operator=(const Decompression&) = delete;
  int status() const { return _status; }

  bz_stream stream{};

 private:
  int _status;
};

ErrorRef failure(int status, std::string reason) {
  return Error::errorWithDomain_code_reason(std::string(kBzip2ErrorDomain), status, std::move(reason));
}

char* asCharacters(const std::uint8_t* bytes) {
  // libbz2's interface has no const; it only reads its input.
  return reinterpret_cast<char*>(const_cast<std::uint8_t*>(bytes));
}

}  // namespace

std::optional<Bytes> Bzip2Compressor::Bzip2Compress(std::span<const std::uint8_t> bytes) {
  // The bound that libbz2 documents: one per cent and 600 bytes more than the input.
  const std::size_t bound = bytes.size() + bytes.size() / 100 + 600;
  if (bound > kMaximumCount) return std::nullopt;
  Bytes output(bound);
  auto length = static_cast<unsigned>(bound);
  std::uint8_t none = 0;
  const int status = BZ2_bzBuffToBuffCompress(reinterpret_cast<char*>(output.data()), &length,
                                              asCharacters(bytes.empty() ? &none : bytes.data()),
                                              static_cast<unsigned>(bytes.size()), kSmallestBlockSize, 0, 0);
  if (status != BZ_OK) return std::nullopt;
  output.resize(length);
  return output;
}

Outcome<Bytes> bzip2DecompressedData(std::span<const std::uint8_t> bytes, std::size_t maximumSize) {
  if (bytes.size() > kMaximumCount) return failure(BZ_DATA_ERROR, "the bzip2 stream is too large");
  Decompression decompression;
  if (decompression.status() != BZ_OK) return failure(decompression.status(), "there is no memory to decompress");
  bz_stream& stream = decompression.stream;
  stream.next_in = asCharacters(bytes.data());
  stream.avail_in = static_cast<unsigned>(bytes.size());
  const auto where = [&] { return ", at byte " + std::to_string(bytes.size() - stream.avail_in); };
  Bytes output;
  for (;;) {
    constexpr std::size_t kStep = std::size_t{64} << 10;
    const std::size_t size = output.size();
    output.resize(size + kStep);
    stream.next_out = reinterpret_cast<char*>(output.data() + size);
    stream.avail_out = kStep;
    const int status = BZ2_bzDecompress(&stream);
    output.resize(output.size() - stream.avail_out);
    if (output.size() > maximumSize)
      return failure(BZ_OUTBUFF_FULL, "the bzip2 stream holds more than " + std::to_string(maximumSize) + " bytes");
    if (status == BZ_STREAM_END) break;
    if (status != BZ_OK) return failure(status, "the bzip2 stream is broken" + where());
    if (stream.avail_in == 0 && stream.avail_out != 0)
      return failure(BZ_UNEXPECTED_EOF, "the bzip2 stream is cut off" + where());
  }
  if (stream.avail_in != 0) return failure(BZ_DATA_ERROR, "other bytes follow the bzip2 stream" + where());
  return output;
}

}  // namespace nimbo
