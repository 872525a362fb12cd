#pragma once

#include <turbojpeg.h>

#include <memory>
#include <type_traits>

namespace nimbo {

struct JPEGDecoderCloser {
  void operator()(tjhandle decoder) const { ::tjDestroy(decoder); }
};
/// What reads JPEG files, one at a time.
using JPEGDecoder = std::unique_ptr<std::remove_pointer_t<tjhandle>, JPEGDecoderCloser>;

}  // namespace nimbo
