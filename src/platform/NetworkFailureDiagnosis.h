#pragma once

namespace nimbo {

/// Why the network does not answer. The numbers are those of the error texts.
enum class NetworkFailure { unknown = 0, airplaneMode = 1, cellularDataDisabled = 2, noInternet = 3, other = 4 };

/// Looks at the device's network condition.
class NetworkFailureDiagnosis {
 public:
  virtual ~NetworkFailureDiagnosis() = default;
  /// The condition at this moment. Quick; main thread.
  virtual NetworkFailure diagnose() const = 0;
};

}  // namespace nimbo
