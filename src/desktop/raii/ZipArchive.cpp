#include "desktop/raii/ZipArchive.h"

namespace nimbo {

const Zip& Zip::library() {
  static const Zip zip = [] {
    const LazyLibrary library(NIMBO_ZIP_LIBRARY);
    return Zip{library["zip_fdopen"],          library["zip_discard"],
               library["zip_strerror"],        library["zip_error_init_with_code"],
               library["zip_error_strerror"],  library["zip_error_fini"],
               library["zip_get_num_entries"], library["zip_get_name"],
               library["zip_name_locate"],     library["zip_fopen_index"],
               library["zip_fread"],           library["zip_file_get_error"],
               library["zip_fclose"]};
  }();
  return zip;
}

}  // namespace nimbo
