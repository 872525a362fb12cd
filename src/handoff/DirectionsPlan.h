#pragma once

#include "handoff/DirectionsPlanTransitPreferences.h"
#include "platform/wire/PlanRecords.h"

namespace nimbo {

class DirectionsPlan;

inline constexpr std::string_view kDisplayMethodNames[] = {"DirectionsSearch", "RoutePicking", "DirectionsStarted"};
inline constexpr std::string_view kTransitPrioritizationNames[] = {
    "TRANSIT_PRIORITIZE_DEFAULT", "TRANSIT_PRIORITIZE_BY_TRAVEL_TIME", "TRANSIT_PRIORITIZE_BY_TRANSFER_COUNT",
    "TRANSIT_PRIORITIZE_BY_WALKING_DISTANCE"};

/// Fields by the numbers 1 to 17 in this order, and 404.
struct DirectionsPlanFields {
  std::shared_ptr<StoredRouteRequest> routeRequestStorage;
  std::optional<std::string> originString;
  std::optional<std::string> destinationString;
  Scalar<double> departureTime;
  Scalar<double> arrivalTime;
  Scalar<std::uint64_t> currentRouteIndex;
  Scalar<std::uint64_t> currentRouteStep;
  NamedScalar<kDisplayMethodNames> displayMethod;
  std::shared_ptr<DirectionsPlanTransitPreferences> transitPreferences;
  Scalar<std::uint32_t> routesPerInitialPage;
  Scalar<std::uint32_t> earlierPagesLoaded;
  Scalar<std::uint32_t> laterPagesLoaded;
  Scalar<std::uint32_t> routesPerEarlierPage;
  Scalar<std::uint32_t> routesPerLaterPage;
  NamedScalar<kTransitPrioritizationNames> transitPrioritization;
  Scalar<std::int32_t> transitSurchargeOption;
  Scalar<double> expiryTime;
  Scalar<bool> isPlayingTrace;
};

extern template class Record<DirectionsPlan, DirectionsPlanFields>;

/// Directions that the map application shows. It gives the times their base and unit; the widget sets no field.
class DirectionsPlan final : public Record<DirectionsPlan, DirectionsPlanFields> {
 public:
  const std::shared_ptr<StoredRouteRequest>& routeRequestStorage() const { return _fields.routeRequestStorage; }
  void setRouteRequestStorage(std::shared_ptr<StoredRouteRequest> value) {
    _fields.routeRequestStorage = std::move(value);
  }
  bool hasRouteRequestStorage() const { return _fields.routeRequestStorage != nullptr; }

  const std::optional<std::string>& originString() const { return _fields.originString; }
  void setOriginString(std::optional<std::string> value) { _fields.originString = std::move(value); }
  bool hasOriginString() const { return _fields.originString.has_value(); }

  const std::optional<std::string>& destinationString() const { return _fields.destinationString; }
  void setDestinationString(std::optional<std::string> value) { _fields.destinationString = std::move(value); }
  bool hasDestinationString() const { return _fields.destinationString.has_value(); }

  double departureTime() const { return _fields.departureTime.value; }
  void setDepartureTime(double value) { _fields.departureTime.set(value); }
  bool hasDepartureTime() const { return _fields.departureTime.isPresent; }
  void setHasDepartureTime(bool present) { _fields.departureTime.isPresent = present; }

  double arrivalTime() const { return _fields.arrivalTime.value; }
  void setArrivalTime(double value) { _fields.arrivalTime.set(value); }
  bool hasArrivalTime() const { return _fields.arrivalTime.isPresent; }
  void setHasArrivalTime(bool present) { _fields.arrivalTime.isPresent = present; }

  std::uint64_t currentRouteIndex() const { return _fields.currentRouteIndex.value; }
  void setCurrentRouteIndex(std::uint64_t value) { _fields.currentRouteIndex.set(value); }
  bool hasCurrentRouteIndex() const { return _fields.currentRouteIndex.isPresent; }
  void setHasCurrentRouteIndex(bool present) { _fields.currentRouteIndex.isPresent = present; }

  std::uint64_t currentRouteStep() const { return _fields.currentRouteStep.value; }
  void setCurrentRouteStep(std::uint64_t value) { _fields.currentRouteStep.set(value); }
  bool hasCurrentRouteStep() const { return _fields.currentRouteStep.isPresent; }
  void setHasCurrentRouteStep(bool present) { _fields.currentRouteStep.isPresent = present; }

  std::int32_t displayMethod() const { return _fields.displayMethod.valueOrZero(); }
  void setDisplayMethod(std::int32_t value) { _fields.displayMethod.set(value); }
  bool hasDisplayMethod() const { return _fields.displayMethod.isPresent; }
  void setHasDisplayMethod(bool present) { _fields.displayMethod.isPresent = present; }
  static std::string displayMethodAsString(std::int32_t value) { return nameOfValue(kDisplayMethodNames, value); }
  static std::int32_t StringAsDisplayMethod(std::string_view name) { return valueOfName(kDisplayMethodNames, name); }

  const std::shared_ptr<DirectionsPlanTransitPreferences>& transitPreferences() const {
    return _fields.transitPreferences;
  }
  void setTransitPreferences(std::shared_ptr<DirectionsPlanTransitPreferences> value) {
    _fields.transitPreferences = std::move(value);
  }
  bool hasTransitPreferences() const { return _fields.transitPreferences != nullptr; }

  std::uint32_t routesPerInitialPage() const { return _fields.routesPerInitialPage.value; }
  void setRoutesPerInitialPage(std::uint32_t value) { _fields.routesPerInitialPage.set(value); }
  bool hasRoutesPerInitialPage() const { return _fields.routesPerInitialPage.isPresent; }
  void setHasRoutesPerInitialPage(bool present) { _fields.routesPerInitialPage.isPresent = present; }

  std::uint32_t earlierPagesLoaded() const { return _fields.earlierPagesLoaded.value; }
  void setEarlierPagesLoaded(std::uint32_t value) { _fields.earlierPagesLoaded.set(value); }
  bool hasEarlierPagesLoaded() const { return _fields.earlierPagesLoaded.isPresent; }
  void setHasEarlierPagesLoaded(bool present) { _fields.earlierPagesLoaded.isPresent = present; }

  std::uint32_t laterPagesLoaded() const { return _fields.laterPagesLoaded.value; }
  void setLaterPagesLoaded(std::uint32_t value) { _fields.laterPagesLoaded.set(value); }
  bool hasLaterPagesLoaded() const { return _fields.laterPagesLoaded.isPresent; }
  void setHasLaterPagesLoaded(bool present) { _fields.laterPagesLoaded.isPresent = present; }

  std::uint32_t routesPerEarlierPage() const { return _fields.routesPerEarlierPage.value; }
  void setRoutesPerEarlierPage(std::uint32_t value) { _fields.routesPerEarlierPage.set(value); }
  bool hasRoutesPerEarlierPage() const { return _fields.routesPerEarlierPage.isPresent; }
  void setHasRoutesPerEarlierPage(bool present) { _fields.routesPerEarlierPage.isPresent = present; }

  std::uint32_t routesPerLaterPage() const { return _fields.routesPerLaterPage.value; }
  void setRoutesPerLaterPage(std::uint32_t value) { _fields.routesPerLaterPage.set(value); }
  bool hasRoutesPerLaterPage() const { return _fields.routesPerLaterPage.isPresent; }
  void setHasRoutesPerLaterPage(bool present) { _fields.routesPerLaterPage.isPresent = present; }

  std::int32_t transitPrioritization() const { return _fields.transitPrioritization.valueOrZero(); }
  void setTransitPrioritization(std::int32_t value) { _fields.transitPrioritization.set(value); }
  bool hasTransitPrioritization() const { return _fields.transitPrioritization.isPresent; }
  void setHasTransitPrioritization(bool present) { _fields.transitPrioritization.isPresent = present; }
  static std::string transitPrioritizationAsString(std::int32_t value) {
    return nameOfValue(kTransitPrioritizationNames, value);
  }
  static std::int32_t StringAsTransitPrioritization(std::string_view name) {
    return valueOfName(kTransitPrioritizationNames, name);
  }

  std::int32_t transitSurchargeOption() const { return _fields.transitSurchargeOption.value; }
  void setTransitSurchargeOption(std::int32_t value) { _fields.transitSurchargeOption.set(value); }
  bool hasTransitSurchargeOption() const { return _fields.transitSurchargeOption.isPresent; }
  void setHasTransitSurchargeOption(bool present) { _fields.transitSurchargeOption.isPresent = present; }

  double expiryTime() const { return _fields.expiryTime.value; }
  void setExpiryTime(double value) { _fields.expiryTime.set(value); }
  bool hasExpiryTime() const { return _fields.expiryTime.isPresent; }
  void setHasExpiryTime(bool present) { _fields.expiryTime.isPresent = present; }

  bool isPlayingTrace() const { return _fields.isPlayingTrace.value; }
  void setIsPlayingTrace(bool value) { _fields.isPlayingTrace.set(value); }
  bool hasIsPlayingTrace() const { return _fields.isPlayingTrace.isPresent; }
  void setHasIsPlayingTrace(bool present) { _fields.isPlayingTrace.isPresent = present; }
  bool readFrom(ProtobufReader& reader) override;

  std::string_view className() const override { return "DirectionsPlan"; }
};

/// What `readFrom` does.
bool DirectionsPlanReadFrom(DirectionsPlan& plan, ProtobufReader& reader);

}  // namespace nimbo
