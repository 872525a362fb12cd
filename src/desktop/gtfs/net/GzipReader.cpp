#include "desktop/gtfs/net/GzipReader.h"

#include <array>
#include <new>

namespace nimbo {

namespace {

constexpr int kGzipAlone = 16 + MAX_WBITS;

}  // namespace

GzipReader::GzipReader() {
  if (::inflateInit2(&_stream, kGzipAlone) != Z_OK) throw std::bad_alloc();
}

GzipReader::~GzipReader() { ::inflateEnd(&_stream); }

bool GzipReader::take(std::string_view piece, const Sink& sink) {
  // zlib takes no pointer to const, and changes nothing behind it.
  _stream.next_in = reinterpret_cast<Bytef*>(const_cast<char*>(piece.data()));
  _stream.avail_in = static_cast<uInt>(piece.size());
  std::array<char, 1 << 14> room;
  do {
    if (_stream.avail_in > 0 && _isAtEnd) {
      ::inflateReset(&_stream);  // another member; anything else is found to be none
      _isAtEnd = false;
    }
    _stream.next_out = reinterpret_cast<Bytef*>(room.data());
    _stream.avail_out = room.size();
    const int result = ::inflate(&_stream, Z_NO_FLUSH);
    _isAtEnd = result == Z_STREAM_END;
    _isDamaged = result != Z_OK && result != Z_STREAM_END && result != Z_BUF_ERROR;
    if (_isDamaged) return false;
    const std::size_t count = room.size() - _stream.avail_out;
    if (count > 0 && !sink({room.data(), count})) return false;
  } while (_stream.avail_in > 0 || (_stream.avail_out == 0 && !_isAtEnd));
  return true;
}

}  // namespace nimbo
