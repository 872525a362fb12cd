#pragma once

#include <memory>
#include <span>

#include "incidents/Result.h"
#include "platform/archive/KeyedArchive.h"

namespace nimbo {

/// What the widget shows again after a restart, before its first fetch: the last line items or error, and whether the
/// table was expanded. Immutable.
class NBTransitIncidentViewControllerState final : public Object, public SecureCoding {
 public:
  /// The result may be null; a state without one is written, but not read back.
  static std::shared_ptr<const NBTransitIncidentViewControllerState> initWithLineItemsResult_expanded(
      ResultRef lineItemsResult, bool expanded);

  /// The state of an archive's record; null, and a failed decoding where its content is not what was asked for, when
  /// the record holds no usable result.
  static std::shared_ptr<const NBTransitIncidentViewControllerState> initWithCoder(KeyedDecoder& decoder);

  /// The archived state, or null: with an error in `error`, when that is given, where decoding failed; without one
  /// where the bytes are no archive or hold no state with a result.
  static std::shared_ptr<const NBTransitIncidentViewControllerState> unarchiveFromData_error(
      std::span<const std::uint8_t> data, ErrorRef* error);

  static bool supportsSecureCoding() { return true; }

  /// A success holds an array of line items. May be null.
  const ResultRef& lineItemsResult() const { return _lineItemsResult; }
  bool expanded() const { return _expanded; }

  static const ArchivableClass& archivedClass();
  const ArchivableClass& archivableClass() const override { return archivedClass(); }
  /// Line items are written as snapshots (`StoredTransitLineItem`).
  void encodeWithCoder(KeyedEncoder& coder) const override;

  std::string_view className() const override { return "NBTransitIncidentViewControllerState"; }

 private:
  NBTransitIncidentViewControllerState(ResultRef lineItemsResult, bool expanded)
      : _expanded(expanded), _lineItemsResult(std::move(lineItemsResult)) {}

  bool _expanded;
  ResultRef _lineItemsResult;
};

/// Class name under which earlier versions wrote the state.
inline constexpr std::string_view kEarlierStateClassName = "NBTransitListItemData";

}  // namespace nimbo
