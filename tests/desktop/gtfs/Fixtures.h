#pragma once

#include <google/protobuf/text_format.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <map>
#include <string>

#include "desktop/gtfs/ZipOfRoutes.h"
#include "desktop/gtfs/alerts/IncidentReader.h"
#include "desktop/gtfs/net/FileReading.h"
#include "desktop/gtfs/static/StaticFeedBuilder.h"
#include "gtfs-realtime.pb.h"
#include "support/TemporaryFolder.h"

namespace nimbo {

/// A static feed's files in memory.
class MemoryFeedFiles final : public StaticFeedFiles {
 public:
  MemoryFeedFiles(std::initializer_list<std::pair<const std::string, std::string>> files) : _files(files) {}
  Outcome<bool> read(std::string_view name, std::uint64_t, const Sink& sink) override {
    const auto file = _files.find(name);
    return file != _files.end() && (sink(file->second), true);
  }
  std::string_view place() const override { return "in memory"; }

 private:
  std::map<std::string, std::string, std::less<>> _files;
};

inline constexpr std::uint64_t kNow = 1'750'000'000;  // 2025-06-15T15:06:40Z

/// A feed's bytes from entities in protobuf's text form, with a header made at `timestamp`.
inline std::string feedBytes(const std::string& entities, std::uint64_t timestamp = kNow) {
  transit_realtime::FeedMessage message;
  const std::string text =
      "header { gtfs_realtime_version: '2.0' timestamp: " + std::to_string(timestamp) + " } " + entities;
  if (!google::protobuf::TextFormat::ParseFromString(text, &message)) ADD_FAILURE() << "not a feed: " << text;
  return message.SerializeAsString();
}

/// An alert with a header text, and more in protobuf's text form.
inline std::string alert(const std::string& id, const std::string& title, const std::string& more) {
  return "entity { id: '" + id + "' alert { header_text { translation { text: '" + title + "' } } " + more + " } } ";
}

inline std::string route(const std::string& id) { return "informed_entity { route_id: '" + id + "' } "; }

}  // namespace nimbo
