#pragma once

#include <string>

namespace nimbo {

/// Something that the user is told outside of the program's own windows. Texts are plain, without markup.
struct Notice {
  /// How much it may disturb. One that is critical stays on the screen until the user has dismissed it.
  enum class Urgency { low, normal, critical };

  std::string key;    ///< what it is about; it takes the place of the notice that stands under the same key
  std::string title;  ///< one line
  std::string body;   ///< may have several lines; empty: none
  Urgency urgency = Urgency::normal;
  bool silent = false;  ///< changes what stands without sound and pop-up; shows nothing where nothing stands
  std::string opens;    ///< address of the "nimbo" scheme that a click opens; empty: a click opens nothing

  /// Whether both tell the same, aloud or not.
  bool tellsTheSame(const Notice& other) const {
    return title == other.title && body == other.body && urgency == other.urgency && opens == other.opens;
  }
};

}  // namespace nimbo
