# One interface target holds every warning flag of the project.
add_library(nimbo_warnings INTERFACE)
target_compile_options(nimbo_warnings INTERFACE
  -Wall -Wextra -Wpedantic -Wshadow -Wnon-virtual-dtor -Wold-style-cast -Woverloaded-virtual -Wcast-align
  "$<$<CXX_COMPILER_ID:GNU>:-Wduplicated-cond;-Wlogical-op>"
  # Where g++ 12 optimizes more, it reports nlohmann's parser.
  $<$<CONFIG:Debug>:-Wnull-dereference>
  # Nor does it understand a character joined with a string: https://gcc.gnu.org/bugzilla/show_bug.cgi?id=105651
  $<$<CXX_COMPILER_ID:GNU>:-Wno-restrict>
  # g++ 12 reports members of moved-from optionals and variants as maybe uninitialized under the sanitizers.
  $<$<CXX_COMPILER_ID:GNU>:-Wno-maybe-uninitialized>
  # Designated initializers leave the fields they do not name at their defaults, on purpose.
  -Wno-missing-field-initializers
  $<$<BOOL:${NIMBO_WARNINGS_AS_ERRORS}>:-Werror>)
