// What the widget keeps and hands over: archives, saved states, compressed records, and their text for people.

#include <nlohmann/json.hpp>

#include "Fuzz.h"
#include "desktop/archive/CBORKeyedArchive.h"
#include "platform/wire/StoredTransitIncident.h"
#include "platform/wire/StoredTransitLineItem.h"
#include "process/HandoffDecoder.h"
#include "protocol/Coding.h"
#include "widget/NBTransitIncidentViewControllerState.h"

namespace nimbo {

namespace {

constexpr auto kReplace = nlohmann::json::error_handler_t::replace;

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
  if (!opened) return nullptr;
  (*opened)->setDecodingFailurePolicy(policy);
  return (*opened)->decodeTopLevelObjectOfClasses_forKey(kAll, kKeyedArchiveRootObjectKey).object;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  if (const auto decoded = decodeHandoff({data, size})) {
    require(nlohmann::json::accept(decoded->text), "what is shown is JSON");
    // As a line, where what is not UTF-8 is replaced.
    const auto line = nlohmann::json::parse(protocol::write(*decoded).dump(-1, ' ', false, kReplace));
    require(protocol::write(protocol::read<protocol::Handoff>(line)) == line, "what is answered can be read");
  } else {
    require(!decoded.error()->reason().empty(), "what cannot be shown has a reason");
  }

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
  require(bool(written), "what an archive held can be archived");
  const auto again =
      archive.archivedDataWithRootObject(rootOf(*written, DecodingFailurePolicy::setErrorAndReturn), true);
  require(again && *again == *written, "what was archived is read the same");
  return 0;
}

}  // namespace nimbo
