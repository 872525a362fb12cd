#include "desktop/raii/ICUHandles.h"

#include <array>
#include <stdexcept>

namespace nimbo {

// ICU's headers give every function the version in its name.
#define NIMBO_ICU_NAME(function) NIMBO_ICU_TEXT(function)
#define NIMBO_ICU_TEXT(name) #name

const ICU& ICU::library() {
  static const ICU icu = [] {
    const LazyLibrary library(NIMBO_ICU_LIBRARY);
    return ICU{library[NIMBO_ICU_NAME(u_errorName)],        library[NIMBO_ICU_NAME(u_strToUTF8)],
               library[NIMBO_ICU_NAME(uloc_canonicalize)],  library[NIMBO_ICU_NAME(uloc_forLanguageTag)],
               library[NIMBO_ICU_NAME(uplrules_open)],      library[NIMBO_ICU_NAME(uplrules_select)],
               library[NIMBO_ICU_NAME(uplrules_close)],     library[NIMBO_ICU_NAME(unum_open)],
               library[NIMBO_ICU_NAME(unum_formatDecimal)], library[NIMBO_ICU_NAME(unum_close)],
               library[NIMBO_ICU_NAME(udat_open)],          library[NIMBO_ICU_NAME(udat_setContext)],
               library[NIMBO_ICU_NAME(udat_format)],        library[NIMBO_ICU_NAME(udat_close)],
               library[NIMBO_ICU_NAME(utext_openUTF8)],     library[NIMBO_ICU_NAME(utext_close)],
               library[NIMBO_ICU_NAME(ubrk_open)],          library[NIMBO_ICU_NAME(ubrk_setUText)],
               library[NIMBO_ICU_NAME(ubrk_isBoundary)],    library[NIMBO_ICU_NAME(ubrk_preceding)],
               library[NIMBO_ICU_NAME(ubrk_close)]};
  }();
  return icu;
}

#undef NIMBO_ICU_NAME
#undef NIMBO_ICU_TEXT

void checkICU(UErrorCode status) {
  if (U_FAILURE(status)) throw std::runtime_error(ICU::library().errorName(status));
}

std::string textOfICU(const std::function<std::int32_t(UChar*, std::int32_t, UErrorCode*)>& write) {
  constexpr std::size_t kBytesAUnit = 3;  // of UTF-8, at most
  std::array<UChar, 256> units;           // more than the longest date and number
  UErrorCode status = U_ZERO_ERROR;
  const std::int32_t length = write(units.data(), static_cast<std::int32_t>(units.size()), &status);
  checkICU(status);
  std::string text(static_cast<std::size_t>(length) * kBytesAUnit, '\0');
  std::int32_t size = 0;
  ICU::library().strToUTF8(text.data(), static_cast<std::int32_t>(text.size()), &size, units.data(), length, &status);
  checkICU(status);
  text.resize(static_cast<std::size_t>(size));
  return text;
}

std::string localeOfICU(const std::function<std::int32_t(char*, std::int32_t, UErrorCode*)>& write) {
  std::array<char, ULOC_FULLNAME_CAPACITY> name;
  UErrorCode status = U_ZERO_ERROR;
  const std::int32_t length = write(name.data(), static_cast<std::int32_t>(name.size()), &status);
  checkICU(status);
  return {name.data(), static_cast<std::size_t>(length)};
}

}  // namespace nimbo
