#include "platform/ui/StyledTableCell.h"

namespace nimbo {

namespace {
constexpr double kStandardRowHeight = 44;
}

std::shared_ptr<StyledTableCell> StyledTableCell::initWithStyle_reuseIdentifier(TableCellStyle style,
                                                                                const std::string& reuseIdentifier) {
  return std::make_shared<StyledTableCell>(style, reuseIdentifier);
}

StyledTableCell::StyledTableCell(TableCellStyle, std::string reuseIdentifier)
    : _reuseIdentifier(std::move(reuseIdentifier)), _contentView(std::make_shared<View>()) {
  _contentView->setLayoutName("contentView");
  addFillingSubview(_contentView);
}

FontRef StyledTableCell::preferredTableCellFont(TextStyle style, FontTraits traits) {
  return Font::preferredFont(style, traits);
}

double StyledTableCell::fittingHeight(double estimate) {
  if (_contentView->subviews().empty()) return kStandardRowHeight;
  return systemLayoutSizeFittingSize_withHorizontalFittingPriority_verticalFittingPriority(
             {frame().width, estimate}, kLayoutPriorityRequired, kLayoutPriorityFittingSize)
      .height;
}

}  // namespace nimbo
