// What the widget keeps and hands over: archives, saved states, compressed records, and their text for people.

#include <nlohmann/json.hpp>

#include "Fuzz.h"
#include "desktop/archive/CBORKeyedArchive.h"
#include "desktop/archive/HandoffDecoder.h"
#include "platform/wire/StoredTransitIncident.h"
#include "platform/wire/StoredTransitLineItem.h"
#include "widget/NBTransitIncidentViewControllerState.h"

namespace nimbo {

namespace {

/// The root as an object, of whatever class it is.
ObjectRef rootOf(std::span<const std::uint8_t> bytes, DecodingFailurePolicy policy) {
  static const AllowedClasses kAll{&kStringClass,
                                   &kNumberClass,
                                   &kDataClass,
                                   &kDateClass,
                                   &kArrayClass,
                                   &kDictionaryClass,
                                   &kErrorClass,
                                   &StoredTransitIncident::archivedClass(),
                                   &StoredTransitLineItem::archivedClass(),
                                   &NBTransitIncidentViewControllerState::archivedClass()};
  const auto opened = CBORKeyedArchive::openData(bytes);
  require((opened.unarchiver == nullptr) == (opened.error != nullptr), "no archive comes with a reason");
  if (!opened.unarchiver) return nullptr;
  opened.unarchiver->setDecodingFailurePolicy(policy);
  return opened.unarchiver->decodeTopLevelObjectOfClasses_forKey(kAll, kKeyedArchiveRootObjectKey).object;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const auto shown = decodeHandoff({data, size});
  require(shown.json.has_value() == (shown.error == nullptr), "what cannot be shown has a reason");
  require(!shown.json || nlohmann::json::accept(*shown.json), "what is shown is JSON");

  const ObjectRef root = rootOf({data, size}, DecodingFailurePolicy::setErrorAndReturn);
  try {
    require((rootOf({data, size}, DecodingFailurePolicy::raiseException) == nullptr) == (root == nullptr),
            "the policy does not matter where nothing fails");
  } catch (const std::runtime_error&) {
    require(root == nullptr, "the policy does not matter to what fails");
  }
  if (!root) return 0;
  CBORKeyedArchive archive;
  const auto written = archive.archivedDataWithRootObject(root, true);
  require(written.bytes.has_value(), "what an archive held can be archived");
  const auto again =
      archive.archivedDataWithRootObject(rootOf(*written.bytes, DecodingFailurePolicy::setErrorAndReturn), true);
  require(again.bytes == written.bytes, "what was archived is read the same");
  return 0;
}

}  // namespace nimbo
