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
  addSubview(_contentView);
}

double StyledTableCell::heightFittingWidth(double) { return kStandardRowHeight; }

void StyledTableCell::layoutSubviews() {
  View::layoutSubviews();
  _contentView->setFrame(bounds());
}

}  // namespace nimbo
