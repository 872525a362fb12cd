#include "widget/NBTransitIncidentViewControllerState.h"

#include "platform/Platform.h"
#include "platform/wire/StoredTransitLineItem.h"
#include "util/NimboMap.h"

namespace nimbo {

namespace {

constexpr std::string_view kSuccessKey = "lineItemResultSuccess";
constexpr std::string_view kErrorKey = "lineItemResultError";
constexpr std::string_view kExpandedKey = "expanded";

ResultRef decodedResult(KeyedDecoder& decoder) {
  if (decoder.containsValueForKey(kSuccessKey)) {
    const ObjectRef lineItems =
        decoder.decodeObjectOfClasses_forKey({&kArrayClass, &StoredTransitLineItem::archivedClass()}, kSuccessKey);
    return std::dynamic_pointer_cast<const BoxedArray>(lineItems) ? Result::resultWithValue(lineItems) : nullptr;
  }
  const auto error =
      std::dynamic_pointer_cast<const Error>(decoder.decodeObjectOfClasses_forKey({&kErrorClass}, kErrorKey));
  return error ? Result::resultWithError(error) : nullptr;
}

}  // namespace

std::shared_ptr<const NBTransitIncidentViewControllerState>
NBTransitIncidentViewControllerState::initWithLineItemsResult_expanded(ResultRef lineItemsResult, bool expanded) {
  return std::shared_ptr<const NBTransitIncidentViewControllerState>(
      new NBTransitIncidentViewControllerState(std::move(lineItemsResult), expanded));
}

void NBTransitIncidentViewControllerState::encodeWithCoder(KeyedEncoder& coder) const {
  if (_lineItemsResult)
    _lineItemsResult->withValue_orError(
        [&](const ObjectRef& value) {
          const auto array = std::dynamic_pointer_cast<const BoxedArray>(value);
          if (!array) return;
          const auto stored = NimboMap(array->elementsOfClass<TransitLineItem>(),
                                       [](const TransitLineItemRef& lineItem, std::size_t) -> ObjectRef {
                                         return StoredTransitLineItem::initWithLineItem(lineItem);
                                       });
          coder.encodeObject_forKey(std::make_shared<const BoxedArray>(stored), kSuccessKey);
        },
        [&](const ErrorRef& error) { coder.encodeObject_forKey(error, kErrorKey); });
  coder.encodeBool_forKey(_expanded, kExpandedKey);
}

std::shared_ptr<const NBTransitIncidentViewControllerState> NBTransitIncidentViewControllerState::initWithCoder(
    KeyedDecoder& decoder) {
  ResultRef result = decodedResult(decoder);
  return result ? initWithLineItemsResult_expanded(std::move(result), decoder.decodeBoolForKey(kExpandedKey)) : nullptr;
}

std::shared_ptr<const NBTransitIncidentViewControllerState>
NBTransitIncidentViewControllerState::unarchiveFromData_error(std::span<const std::uint8_t> data, ErrorRef* error) {
  const auto unarchiver = Platform::current().archive().unarchiverForReadingFromData(data);
  if (!unarchiver) return nullptr;
  unarchiver->setClass_forClassName(archivedClass(), kEarlierStateClassName);
  unarchiver->setDecodingFailurePolicy(DecodingFailurePolicy::setErrorAndReturn);
  const auto decoded = unarchiver->decodeTopLevelObjectOfClasses_forKey({&archivedClass()}, kKeyedArchiveRootObjectKey);
  if (error) *error = decoded.error;
  unarchiver->finishDecoding();
  return std::dynamic_pointer_cast<const NBTransitIncidentViewControllerState>(decoded.object);
}

const ArchivableClass& NBTransitIncidentViewControllerState::archivedClass() {
  static constexpr ArchivableClass archived{"NBTransitIncidentViewControllerState",
                                            [](KeyedDecoder& decoder) -> ObjectRef { return initWithCoder(decoder); }};
  return archived;
}

}  // namespace nimbo
