#pragma once

#include "platform/wire/Record.h"
#include "platform/wire/Scalar.h"

namespace nimbo {

class StoredSearchCategory;

struct StoredSearchCategoryFields {
  std::optional<std::string> identifier;
  std::optional<std::string> displayName;
};

extern template class Record<StoredSearchCategory, StoredSearchCategoryFields>;

/// A category to search in, such as restaurants.
class StoredSearchCategory final : public Record<StoredSearchCategory, StoredSearchCategoryFields> {
 public:
  /// The same in every language.
  const std::optional<std::string>& identifier() const { return _fields.identifier; }
  void setIdentifier(std::optional<std::string> value) { _fields.identifier = std::move(value); }
  bool hasIdentifier() const { return _fields.identifier.has_value(); }

  /// In the user's language.
  const std::optional<std::string>& displayName() const { return _fields.displayName; }
  void setDisplayName(std::optional<std::string> value) { _fields.displayName = std::move(value); }
  bool hasDisplayName() const { return _fields.displayName.has_value(); }

  std::string_view className() const override { return "StoredSearchCategory"; }
};

}  // namespace nimbo
