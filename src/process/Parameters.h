#pragma once

#include <cstdint>
#include <nlohmann/json.hpp>
#include <optional>
#include <string>
#include <string_view>

#include "desktop/rpc/JSONRPC.h"
#include "platform/foundation/Geometry.h"
#include "platform/ui/Environment.h"
#include "platform/ui/IndexPath.h"
#include "platform/ui/WidgetHost.h"

namespace nimbo {

/// The parameters of a request, read strictly: a missing or ill-formed one throws JSONRPCFailure with "invalid params",
/// before anything has changed.
class Parameters {
 public:
  explicit Parameters(const nlohmann::json& params) : _params(params) {}

  bool has(std::string_view name) const { return _params.contains(name); }
  std::string text(std::string_view name) const;
  std::optional<std::string> optionalText(std::string_view name) const;
  /// A finite number within the bounds.
  double number(std::string_view name, double minimum, double maximum) const;
  /// [width, height], each from 0 to 100000 points.
  Size size(std::string_view name) const;
  IndexPath indexPath() const;
  bool flag(std::string_view name) const;
  WidgetDisplayMode displayMode(std::string_view name) const;
  ContentSizeCategory textSize(std::string_view name) const;
  Appearance appearance(std::string_view name) const;
  /// The parameters inside the object of this name.
  Parameters object(std::string_view name) const;

 private:
  const nlohmann::json& value(std::string_view name) const;
  const nlohmann::json& _params;
};

/// "compact" or "expanded".
std::string_view nameOfDisplayMode(WidgetDisplayMode mode);

}  // namespace nimbo
