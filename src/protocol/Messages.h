#pragma once

#include <cstdint>
#include <map>
#include <memory>
#include <optional>
#include <string>

#include "platform/foundation/Date.h"
#include "platform/foundation/Geometry.h"
#include "platform/foundation/Presentation.h"

// What requests and notifications are made with and what is answered, as docs/protocol.md has them. An optional is
// absent from the message unless it is said to stand as null. Lengths are points.
namespace nimbo::protocol {

/// Of what needs no more than its name.
struct Nothing {};

/// A program, and the one that it lives in.
struct Bundle {
  std::string kind;  ///< `kApplication`, `kExtension`, or any other
  std::string identifier;
  std::shared_ptr<Bundle> containing;  ///< null: none

  static constexpr std::string_view kApplication = "application";
  static constexpr std::string_view kExtension = "extension";
};

/// The most room that each mode gives.
struct DisplayModes {
  Size compact;
  Size expanded;
  bool operator==(const DisplayModes&) const = default;
};

struct InitializeParams {
  std::optional<std::string> locale;
  ContentSizeCategory textSize = ContentSizeCategory::large;
  double scale = 1;
  Appearance appearance = Appearance::light;
  std::optional<DisplayModes> displayModes;
  std::optional<WidgetDisplayMode> activeDisplayMode;
  std::optional<Bundle> bundle;
};

struct Initialized {
  std::string name;
  std::string version;
  std::int64_t protocol = 0;
};

struct UpdateParams {
  /// Seconds: an answer of a server that is no older serves, whichever process got it; absent: the servers are asked.
  std::optional<double> maxAge;
};

struct UpdateResult {
  WidgetUpdateResult updateResult = WidgetUpdateResult::NewData;
  std::optional<std::string> reason;  ///< of a failure
  std::optional<bool> isDownloading;  ///< true where it is for want of a static feed that is still coming
  std::optional<double> age;          ///< seconds since the youngest answer of a server came; absent without servers
  double refreshSeconds = 60;         ///< as the user has it, whatever became of the update
};

/// What became of the rows that are kept for the next start.
struct Kept {
  std::optional<std::string> failure;  ///< why they could not be kept; absent: they are
};

struct ActiveDisplayModeParams {
  WidgetDisplayMode mode = WidgetDisplayMode::Compact;
  std::optional<Size> maximumSize;
};

struct TransitionParams {
  Size size;
  std::optional<DisplayModes> displayModes;
};

struct TextSizeParams {
  ContentSizeCategory category = ContentSizeCategory::large;
};

struct AppearanceParams {
  Appearance appearance = Appearance::light;
};

struct ScaleParams {
  double scale = 1;
};

struct RowParams {
  std::uint32_t section = 0;
  std::uint32_t row = 0;
};

struct Selected {
  bool selected = false;
};

struct HighlightParams {
  std::uint32_t section = 0;
  std::uint32_t row = 0;
  bool highlighted = true;
};

struct Highlighted {
  bool highlighted = false;
};

struct SnapshotParams {
  bool rows = true;  ///< whether the rows are wanted as laid out, with what depends on that
};

struct RenderParams {
  std::optional<std::uint64_t> offset;    ///< bytes from the memory's beginning to the picture; absent: 0
  std::optional<std::uint64_t> capacity;  ///< bytes that it may take there; absent: all that follow
  // Neither of these is taken any more.
  std::optional<std::string> path;
  std::optional<std::string> surface;
};

struct Rendered {
  std::int32_t width = 0;   ///< pixels
  std::int32_t height = 0;  ///< pixels
  std::int32_t stride = 0;  ///< bytes
  double scale = 1;
};

/// The image of an incident of a favorite line, drawn into the memory as `render` does.
struct ImageParams {
  std::string incident;     ///< its number in decimal
  std::uint32_t width = 0;  ///< pixels that there is room for: a wider image is scaled down
  std::optional<std::uint64_t> offset;
  std::optional<std::uint64_t> capacity;
};

struct AdvanceParams {
  double seconds = 0;
};

struct Advanced {
  Date now;
};

struct OpenURLParams {
  std::string url;
};

struct OpenUserActivityParams {
  std::string activityType;
  std::map<std::string, std::string> userInfo;  ///< Base64 by key
  std::optional<std::string> application;       ///< null: whichever opens it
  bool requireUnlockPrompt = false;
};

struct Opened {
  bool opened = false;
  std::optional<std::string> error;
};

struct PreferredSizeParams {
  Size size;
};

struct LargestDisplayModeParams {
  WidgetDisplayMode mode = WidgetDisplayMode::Expanded;
};

struct NoticeParams {
  std::string message;
};

struct LogParams {
  std::string level;
  std::string category;
  std::string message;
};

}  // namespace nimbo::protocol
