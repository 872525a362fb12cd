#pragma once

#include <unicode/ubrk.h>
#include <unicode/udat.h>
#include <unicode/uloc.h>
#include <unicode/unum.h>
#include <unicode/upluralrules.h>
#include <unicode/ustring.h>
#include <unicode/utext.h>

#include <functional>
#include <memory>
#include <string>

#include "desktop/raii/LazyLibrary.h"

namespace nimbo {

/// ICU, which is opened with the first count or date to be told, or long text to be cut. Its interface is the one in C,
/// since one in C++ cannot be opened late.
struct ICU {
  /// Opens ICU with the first call. Throws std::runtime_error where there is none.
  static const ICU& library();

  decltype(&::u_errorName) errorName;
  decltype(&::u_strToUTF8) strToUTF8;
  decltype(&::uloc_canonicalize) loc_canonicalize;
  decltype(&::uloc_forLanguageTag) loc_forLanguageTag;
  decltype(&::uplrules_open) plrules_open;
  decltype(&::uplrules_select) plrules_select;
  decltype(&::uplrules_close) plrules_close;
  decltype(&::unum_open) num_open;
  decltype(&::unum_formatDecimal) num_formatDecimal;
  decltype(&::unum_close) num_close;
  decltype(&::udat_open) dat_open;
  decltype(&::udat_setContext) dat_setContext;
  decltype(&::udat_format) dat_format;
  decltype(&::udat_close) dat_close;
  decltype(&::utext_openUTF8) text_openUTF8;
  decltype(&::utext_close) text_close;
  decltype(&::ubrk_open) brk_open;
  decltype(&::ubrk_setUText) brk_setUText;
  decltype(&::ubrk_isBoundary) brk_isBoundary;
  decltype(&::ubrk_preceding) brk_preceding;
  decltype(&::ubrk_close) brk_close;
};

struct ICUPluralRulesCloser {
  void operator()(UPluralRules* rules) const { ICU::library().plrules_close(rules); }
};
using ICUPluralRules = std::unique_ptr<UPluralRules, ICUPluralRulesCloser>;

struct ICUNumberFormatCloser {
  void operator()(UNumberFormat* format) const { ICU::library().num_close(format); }
};
using ICUNumberFormat = std::unique_ptr<UNumberFormat, ICUNumberFormatCloser>;

struct ICUDateFormatCloser {
  void operator()(UDateFormat* format) const { ICU::library().dat_close(format); }
};
using ICUDateFormat = std::unique_ptr<UDateFormat, ICUDateFormatCloser>;

struct ICUTextCloser {
  void operator()(UText* text) const { ICU::library().text_close(text); }
};
using ICUText = std::unique_ptr<UText, ICUTextCloser>;

struct ICUBreakIteratorCloser {
  void operator()(UBreakIterator* iterator) const { ICU::library().brk_close(iterator); }
};
using ICUBreakIterator = std::unique_ptr<UBreakIterator, ICUBreakIteratorCloser>;

/// Throws std::runtime_error with ICU's name of a failure.
void checkICU(UErrorCode status);

/// What `write` writes into a buffer of this size (it answers the length), in UTF-8. Throws std::runtime_error when it
/// fails.
std::string textOfICU(const std::function<std::int32_t(UChar* text, std::int32_t size, UErrorCode* status)>& write);

/// The identifier that `write` writes, in ASCII: likewise.
std::string localeOfICU(const std::function<std::int32_t(char* text, std::int32_t size, UErrorCode* status)>& write);

}  // namespace nimbo
