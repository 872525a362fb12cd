#pragma once

#include <zip.h>

#include <memory>

namespace nimbo {

struct ZipArchiveDiscarder {
  void operator()(zip_t* archive) const { ::zip_discard(archive); }
};
/// An archive opened for reading.
using ZipArchive = std::unique_ptr<zip_t, ZipArchiveDiscarder>;

struct ZipFileCloser {
  void operator()(zip_file_t* file) const { ::zip_fclose(file); }
};
/// A file in an archive, opened; lives no longer than its archive.
using ZipFile = std::unique_ptr<zip_file_t, ZipFileCloser>;

}  // namespace nimbo
