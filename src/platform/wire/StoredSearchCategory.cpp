#include "platform/wire/StoredSearchCategory.h"

#include "platform/wire/RecordImplementation.h"

namespace nimbo {

template <>
struct RecordTable<StoredSearchCategoryFields> {
  static constexpr std::tuple fields{Field{1, "identifier", &StoredSearchCategoryFields::identifier},
                                     Field{2, "displayName", &StoredSearchCategoryFields::displayName}};
};

template class Record<StoredSearchCategory, StoredSearchCategoryFields>;

}  // namespace nimbo
