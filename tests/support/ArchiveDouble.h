#pragma once

#include <typeinfo>

#include "platform/archive/KeyedArchive.h"

namespace nimbo {

/// Archives to a readable text that nothing reads back: equal objects give equal bytes.
class ArchiveDouble final : public KeyedArchive {
 public:
  Outcome<Bytes> archivedDataWithRootObject(const ObjectRef& root, bool requiringSecureCoding) override {
    TextEncoder encoder;
    encoder.encodeObject_forKey(root, kKeyedArchiveRootObjectKey);
    if (fails || !requiringSecureCoding)
      return Error::errorWithDomain_code_reason(std::string(kKeyedArchiveErrorDomain), 1, "cannot be archived");
    return Bytes(encoder.text.begin(), encoder.text.end());
  }
  std::unique_ptr<KeyedUnarchiver> unarchiverForReadingFromData(std::span<const std::uint8_t>) override {
    return nullptr;
  }
  bool fails = false;

 private:
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
};

}  // namespace nimbo
