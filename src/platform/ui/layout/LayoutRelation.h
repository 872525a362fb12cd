#pragma once

namespace nimbo {

enum class LayoutRelation { lessThanOrEqual = -1, equal = 0, greaterThanOrEqual = 1 };

}  // namespace nimbo
