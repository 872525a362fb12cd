#pragma once

#include <string>

namespace nimbo {

/// What to tell the user of a favourite line, "FEED:ROUTE_ID", that its feed does not know any more.
inline std::string goneLineText(const std::string& line) {
  return "the favorite line " + line +
         " is gone from its feed, and its incidents with it. Find it anew with \"lines\", or forget it with \"favorite "
         "remove " +
         line + "\".";
}

}  // namespace nimbo
