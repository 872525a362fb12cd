#pragma once

#include <zlib.h>

#include <functional>
#include <string_view>

namespace nimbo {

/// Unpacks gzip as it comes, piece by piece. Source: RFC 1952.
class GzipReader {
 public:
  using Sink = std::function<bool(std::string_view piece)>;

  /// Throws std::bad_alloc.
  GzipReader();
  ~GzipReader();
  GzipReader(const GzipReader&) = delete;
  GzipReader& operator=(const GzipReader&) = delete;

  /// Gives what a piece holds to `sink`. False when that refuses it, or the bytes are damaged.
  bool take(std::string_view piece, const Sink& sink);
  /// Whether all has come: a trailer that fits, and nothing behind it.
  bool isWhole() const { return _isAtEnd; }
  bool isDamaged() const { return _isDamaged; }

 private:
  z_stream _stream{};
  bool _isAtEnd = false;
  bool _isDamaged = false;
};

}  // namespace nimbo
