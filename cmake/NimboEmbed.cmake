# nimbo_embed(TARGET PATH...): puts files below resources/ into the program, found by their path with
# `nimbo::resourceNamed("strings/en.json")`. The assembler reads the files: no compile time for their bytes.
function(nimbo_embed target)
  set(declarations "")
  set(entries "")
  set(index 0)
  foreach(path ${ARGN})
    set(file ${PROJECT_SOURCE_DIR}/resources/${path})
    string(APPEND declarations
      "__asm__(\".pushsection .rodata\\n\"\n"
      "        \".global nimbo_resource_${index}, nimbo_resource_${index}_end\\n\"\n"
      "        \"nimbo_resource_${index}:\\n.incbin \\\"${file}\\\"\\nnimbo_resource_${index}_end:\\n.byte 0\\n\"\n"
      "        \".popsection\\n\");\n"
      "extern \"C\" const char nimbo_resource_${index}[], nimbo_resource_${index}_end[];\n")
    string(APPEND entries
      "    {\"${path}\", nimbo_resource_${index}, nimbo_resource_${index}_end},\n")
    list(APPEND files ${file})
    math(EXPR index "${index} + 1")
  endforeach()
  set(output ${CMAKE_CURRENT_BINARY_DIR}/EmbeddedResources.cpp)
  file(CONFIGURE OUTPUT ${output} CONTENT
"#include \"desktop/resources/Resources.h\"

@declarations@
namespace nimbo {

const EmbeddedResource* const kEmbeddedResourcesBegin = [] {
  static const EmbeddedResource resources[] = {
@entries@    {\"\", nullptr, nullptr}};
  return resources;
}();
const std::size_t kEmbeddedResourcesCount = ${index};

}  // namespace nimbo
" @ONLY)
  set_source_files_properties(${output} TARGET_DIRECTORY ${target} PROPERTIES OBJECT_DEPENDS "${files}")
  target_sources(${target} PRIVATE ${output})
endfunction()
