#pragma once

namespace nimbo {

/// How much a constraint matters: from 1 to 1000. A higher one is never traded for any number of lower ones.
using LayoutPriority = float;

inline constexpr LayoutPriority kLayoutPriorityRequired = 1000;
/// How strongly a view resists to being smaller than its content, until set.
inline constexpr LayoutPriority kLayoutPriorityCompressionResistance = 750;
/// How strongly a view resists to being larger than its content, until set.
inline constexpr LayoutPriority kLayoutPriorityHugging = 250;
/// How strongly a view that is measured wants to be small.
inline constexpr LayoutPriority kLayoutPriorityFittingSize = 50;

}  // namespace nimbo
