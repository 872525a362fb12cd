#pragma once

#include <cstdint>
#include <memory>
#include <string>

#include "platform/ui/Font.h"
#include "platform/ui/View.h"

namespace nimbo {

enum class TableCellStyle { standard };

/// A table row's view.
class StyledTableCell : public View {
 public:
  /// An empty cell. Classes with content of their own have a function of the same name that builds it.
  static std::shared_ptr<StyledTableCell> initWithStyle_reuseIdentifier(TableCellStyle style,
                                                                        const std::string& reuseIdentifier);
  StyledTableCell(TableCellStyle style, std::string reuseIdentifier);

  const std::string& reuseIdentifier() const { return _reuseIdentifier; }
  /// Holds the cell's content; as large as the cell.
  const std::shared_ptr<View>& contentView() const { return _contentView; }

  /// 0: no separator under the row; 1: the inset separator.
  std::int64_t separatorStyleOverride() const { return _separatorStyleOverride; }
  void setSeparatorStyleOverride(std::int64_t style) { _separatorStyleOverride = style; }

  /// Whether the row is shown as touched.
  bool isHighlighted() const { return _highlighted; }
  void setHighlighted(bool highlighted) { _highlighted = highlighted; }

  /// The font of a text in a row, at the user's present text size.
  static FontRef preferredTableCellFont(TextStyle style, FontTraits traits);

  /// The height that the constraints inside want at the cell's width, in points, as near to `estimate` as they leave
  /// free; that of a standard row for a cell without content.
  double fittingHeight(double estimate);

  std::string_view className() const override { return "StyledTableCell"; }

 protected:
  bool isLayoutRoot() const override { return true; }
  bool clipsToBounds() const override { return true; }

 private:
  std::string _reuseIdentifier;
  std::shared_ptr<View> _contentView;
  std::int64_t _separatorStyleOverride = 0;
  bool _highlighted = false;
};

}  // namespace nimbo
