#include "support/ArchiveDouble.h"

#include <typeinfo>

namespace nimbo {

namespace {

class TextEncoder final : public KeyedEncoder {
 public:
  void encodeObject_forKey(const ObjectRef& object, std::string_view key) override {
    if (!object) return;
    if (const auto* coding = dynamic_cast<const SecureCoding*>(object.get())) {
      text += std::string(key) + ": " + std::string(coding->archivableClass().name) + " {";
      coding->encodeWithCoder(*this);
      text += "} ";
    } else if (typeid(*object) == typeid(BoxedArray)) {
      text += std::string(key) + ": [";
      for (const ObjectRef& element : static_cast<const BoxedArray&>(*object).elements())
        encodeObject_forKey(element, "element");
      text += "] ";
    } else {
      write(key, object->description());
    }
  }
  void encodeBool_forKey(bool value, std::string_view key) override { write(key, value ? "yes" : "no"); }
  void encodeString_forKey(const std::optional<std::string>& value, std::string_view key) override {
    if (value) write(key, "\"" + *value + "\"");
  }
  void encodeBytes_forKey(std::span<const std::uint8_t> value, std::string_view key) override {
    write(key, std::string(value.begin(), value.end()));
  }

  std::string text;

 private:
  void write(std::string_view key, const std::string& value) { text += std::string(key) + ": " + value + " "; }
};

}  // namespace

Outcome<Bytes> ArchiveDouble::archivedDataWithRootObject(const ObjectRef& root, bool requiringSecureCoding) {
  TextEncoder encoder;
  encoder.encodeObject_forKey(root, kKeyedArchiveRootObjectKey);
  if (fails || !requiringSecureCoding)
    return Error::errorWithDomain_code_reason(std::string(kKeyedArchiveErrorDomain), 1, "cannot be archived");
  return Bytes(encoder.text.begin(), encoder.text.end());
}

}  // namespace nimbo
