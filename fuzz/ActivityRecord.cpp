// The record of a hand-off: a field that was read is written, and read again the same.

#include "Fuzz.h"
#include "handoff/NimboActivity.h"

namespace nimbo {

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  ProtobufReader reader({data, size});
  NimboActivity activity;
  if (!activity.readFrom(reader)) {
    require(!reader.failureText().empty(), "a record that cannot be read has a reason");
    return 0;
  }
  const Bytes written = activity.data();
  ProtobufReader again(written);
  NimboActivity second;
  require(second.readFrom(again) && again.position() == again.length(), "a record that was written can be read");
  require(second.data() == written, "a record that was read is written the same");
  require(second.dictionaryRepresentation()->description() == activity.dictionaryRepresentation()->description(),
          "a record that was read has the same fields");
  require(activity.copyWithZone()->data() == written, "a copy has everything");
  NimboActivity merged;
  merged.mergeFrom(activity);
  require(merged.data() == written, "merging into nothing gives everything");
  return 0;
}

}  // namespace nimbo
