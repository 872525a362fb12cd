#pragma once

#include <zip.h>

#include <memory>

#include "desktop/raii/LazyLibrary.h"

namespace nimbo {

/// libzip, which is opened with the first zip file: few starts of a program read one.
struct Zip {
  /// Opens libzip with the first call. Throws std::runtime_error where there is none.
  static const Zip& library();

  decltype(&::zip_fdopen) fdopen;
  decltype(&::zip_discard) discard;
  decltype(&::zip_strerror) strerror;
  decltype(&::zip_error_init_with_code) error_init_with_code;
  decltype(&::zip_error_strerror) error_strerror;
  decltype(&::zip_error_fini) error_fini;
  decltype(&::zip_get_num_entries) get_num_entries;
  decltype(&::zip_get_name) get_name;
  decltype(&::zip_name_locate) name_locate;
  decltype(&::zip_fopen_index) fopen_index;
  decltype(&::zip_fread) fread;
  decltype(&::zip_file_get_error) file_get_error;
  decltype(&::zip_fclose) fclose;
};

struct ZipArchiveDiscarder {
  void operator()(zip_t* archive) const { Zip::library().discard(archive); }
};
/// An archive opened for reading.
using ZipArchive = std::unique_ptr<zip_t, ZipArchiveDiscarder>;

struct ZipFileCloser {
  void operator()(zip_file_t* file) const { Zip::library().fclose(file); }
};
/// A file in an archive, opened; lives no longer than its archive.
using ZipFile = std::unique_ptr<zip_file_t, ZipFileCloser>;

}  // namespace nimbo
