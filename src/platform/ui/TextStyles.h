#pragma once

#include "platform/ui/Environment.h"

namespace nimbo {

/// What a text is for, from which its size follows.
enum class TextStyle { headline, subheadline, body };

/// The point size of a style at a text size. The table, in points:
///
///     text size                            headline, body   subheadline
///     extraSmall                                 14              12
///     small                                      15              13
///     medium                                     16              14
///     large (the size at which lengths           17              15
///            are given)
///     extraLarge                                 19              17
///     extraExtraLarge                            21              19
///     extraExtraExtraLarge                       23              21
///     accessibilityMedium                        28              25
///     accessibilityLarge                         33              30
///     accessibilityExtraLarge                    40              36
///     accessibilityExtraExtraLarge               47              42
///     accessibilityExtraExtraExtraLarge          53              49
double pointSizeForTextStyle(TextStyle style, ContentSizeCategory category);

/// How much larger or smaller than at the size `large` a headline is.
double textScaleForCategory(ContentSizeCategory category);

}  // namespace nimbo
