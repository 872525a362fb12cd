#include "platform/CellConstraints.h"

namespace nimbo {

namespace {

using enum LayoutRelation;
using Term = CellConstraint::Term;
using Terms = std::vector<Term>;

/// Four variables in a row.
struct Box {
  std::size_t first;
  Terms left() const { return {{first, 1}}; }
  Terms top() const { return {{first + 1, 1}}; }
  Terms width() const { return {{first + 2, 1}}; }
  Terms height() const { return {{first + 3, 1}}; }
  Terms right() const { return {{first, 1}, {first + 2, 1}}; }
  Terms bottom() const { return {{first + 1, 1}, {first + 3, 1}}; }
  Terms middle() const { return {{first + 1, 1}, {first + 3, 0.5}}; }
};

}  // namespace

CellConstraints::CellConstraints() {
  const Terms rootWidth{{0, 1}}, rootHeight{{1, 1}}, rootMiddle{{1, 0.5}}, zero;
  const Box guide{2}, stack{6}, title{10}, text{14}, gutter{18}, shield{22}, plainShield{26};
  variableCount = 30;

  /// a (relation) b + constant
  const auto add = [this](const Terms& a, LayoutRelation relation, const Terms& b, double constant = 0,
                          double priority = 1000) {
    CellConstraint constraint{a, -constant, relation, priority};
    for (const Term& term : b) constraint.terms.push_back({term.variable, -term.coefficient});
    constraints.push_back(constraint);
  };
  const auto addContent = [&](const Box& box, double width, double height) {
    constexpr double kMinimum = 749.5, kHugging = 250;
    add(box.width(), greaterThanOrEqual, zero, width, kMinimum);
    add(box.width(), lessThanOrEqual, zero, width, kHugging);
    add(box.height(), greaterThanOrEqual, zero, height, kMinimum);
    add(box.height(), lessThanOrEqual, zero, height, kHugging);
  };
  constexpr double kRootPriority = 999.9, kCapLinePriority = 750;
  constexpr double kTitleAscent = 16, kTitleDescent = 4, kTextAscent = 14, kTextDescent = 4, kCapHeight = 12;

  add(rootWidth, equal, zero, 327, kRootPriority);
  add(rootHeight, equal, zero, 110, kRootPriority);
  rowHeight = constraints.size();
  add(rootHeight, equal, zero, 110);
  add(guide.middle(), equal, rootMiddle);
  add(guide.left(), equal, zero);
  add(guide.right(), equal, rootWidth);
  add(guide.top(), greaterThanOrEqual, zero);
  add(guide.bottom(), lessThanOrEqual, rootHeight);
  add(gutter.top(), equal, guide.top());
  add(gutter.bottom(), equal, guide.bottom());
  add(gutter.right(), equal, guide.right());
  add(gutter.width(), equal, zero, 73);
  add(title.top(), greaterThanOrEqual, zero);
  add(title.top(), equal, guide.top(), kCapHeight - kTitleAscent, kCapLinePriority);
  add(guide.bottom(), equal, text.bottom(), -kTextDescent);
  add(stack.left(), equal, guide.left());
  add(stack.right(), equal, gutter.left());
  add(shield.right(), equal, gutter.right());
  add(shield.middle(), equal, guide.middle());
  add(shield.top(), greaterThanOrEqual, zero, 8);
  add(shield.bottom(), lessThanOrEqual, rootHeight, -8);
  add(shield.left(), equal, plainShield.left());
  add(shield.right(), equal, plainShield.right());
  add(shield.top(), equal, plainShield.top());
  add(shield.bottom(), equal, plainShield.bottom());
  add(title.left(), equal, stack.left());
  add(title.right(), equal, stack.right());
  add(title.top(), equal, stack.top());
  add(text.left(), equal, stack.left());
  add(text.right(), equal, stack.right());
  add(text.top(), equal, title.bottom(), 21 - kTitleDescent - kTextAscent);
  add(text.bottom(), equal, stack.bottom());
  addContent(title, 210, kTitleAscent + kTitleDescent);
  addContent(text, 480, 2 * (kTextAscent + kTextDescent));
  addContent(shield, 44, 30);
  addContent(plainShield, 44, 30);
}

}  // namespace nimbo
