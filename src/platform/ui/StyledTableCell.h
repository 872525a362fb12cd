#pragma once

#include <cstdint>
#include <string>

#include "platform/ui/View.h"

namespace nimbo {

enum class TableCellStyle { standard };

/// A table row's view.
class StyledTableCell : public View {
 public:
  StyledTableCell(TableCellStyle style, std::string reuseIdentifier);
  /// Builds the content; called once, right after the cell was made.
  virtual void didInit() {}

  const std::string& reuseIdentifier() const { return _reuseIdentifier; }
  /// 0: no separator under the row; 1: the inset separator.
  std::int64_t separatorStyleOverride() const { return _separatorStyleOverride; }
  void setSeparatorStyleOverride(std::int64_t style) { _separatorStyleOverride = style; }

  std::string_view className() const override { return "StyledTableCell"; }

 private:
  std::string _reuseIdentifier;
  std::int64_t _separatorStyleOverride = 0;
};

}  // namespace nimbo
