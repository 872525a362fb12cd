#include "desktop/gtfs/static/ZipFeedFiles.h"

#include <fcntl.h>

#include <array>

#include "desktop/gtfs/feeds/TransitLineServiceError.h"

namespace nimbo {

namespace {

constexpr std::string_view kDecidingFile = "routes.txt";

/// The folder in which the archive's one routes.txt is; empty for the top, also where there is none.
std::string folderOfFeed(zip_t* archive) {
  if (zip_name_locate(archive, kDecidingFile.data(), 0) >= 0) return {};
  std::string folder;
  const zip_int64_t count = zip_get_num_entries(archive, 0);
  for (zip_int64_t i = 0; i < count; ++i) {
    const char* entry = zip_get_name(archive, static_cast<zip_uint64_t>(i), ZIP_FL_ENC_RAW);
    const std::string_view name = entry ? entry : "";
    const std::size_t slash = name.find('/');
    if (slash == std::string_view::npos || name.substr(slash + 1) != kDecidingFile) continue;
    if (!folder.empty()) return {};  // two feeds in one archive: which is meant?
    folder = name.substr(0, slash + 1);
  }
  return folder;
}

}  // namespace

Outcome<std::unique_ptr<StaticFeedFiles>> ZipFeedFiles::open(const FileDescriptor& file, std::string place) {
  // An archive takes its descriptor over once it is open; it gets one of its own, at the beginning of the file.
  const int own = ::fcntl(file.get(), F_DUPFD_CLOEXEC, 0);
  ::lseek(own, 0, SEEK_SET);
  int code = 0;
  ZipArchive archive(zip_fdopen(own, 0, &code));
  if (!archive) {
    ::close(own);
    zip_error_t error;
    zip_error_init_with_code(&error, code);
    const std::string why = zip_error_strerror(&error);
    zip_error_fini(&error);
    return transitLineServiceError(TransitLineServiceError::badStaticFeed,
                                   "The static feed " + place + " cannot be opened as a zip file: " + why +
                                       ". Give a folder or a zip file with agency.txt and routes.txt.",
                                   place);
  }
  std::string folder = folderOfFeed(archive.get());
  return std::unique_ptr<StaticFeedFiles>(new ZipFeedFiles(std::move(archive), std::move(folder), std::move(place)));
}

Outcome<bool> ZipFeedFiles::read(std::string_view name, std::uint64_t limit, const Sink& sink) {
  const std::string path = _folder + std::string(name);
  const zip_int64_t index = zip_name_locate(_archive.get(), path.c_str(), 0);
  if (index < 0) return false;
  const auto broken = [&](const char* why) {
    return transitLineServiceError(
        TransitLineServiceError::badStaticFeed,
        path + " in the static feed " + _place + " cannot be read: " + why + ". Fetch the static feed anew.", _place);
  };
  const ZipFile file(zip_fopen_index(_archive.get(), static_cast<zip_uint64_t>(index), 0));
  if (!file) return broken(zip_strerror(_archive.get()));
  std::array<char, 64 * 1024> buffer;
  for (std::uint64_t total = 0;;) {
    const zip_int64_t count = zip_fread(file.get(), buffer.data(), buffer.size());
    if (count < 0) return broken(zip_error_strerror(zip_file_get_error(file.get())));
    if (count == 0) return true;
    total += static_cast<std::uint64_t>(count);
    if (total > limit)
      return transitLineServiceError(TransitLineServiceError::tooLarge,
                                     path + " in the static feed " + _place + " is larger than the " +
                                         std::to_string(limit >> 20) +
                                         " MiB that such a file may have. Check the static feed.",
                                     _place);
    if (!sink({buffer.data(), static_cast<std::size_t>(count)})) return true;
  }
}

}  // namespace nimbo
