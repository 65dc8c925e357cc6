# Script mode: fails unless the README's host example, the first cpp block after the README first
# names EXAMPLE (by its path from the README's folder), is to the character the code of EXAMPLE
# between its "host example" marks. On a difference both texts go to WORK_DIR for a diff.

# The text that follows the line holding begin, up to the start of the next line holding end.
function(text_between text begin end out)
  string(FIND "${text}" "${begin}" start)
  if(start EQUAL -1)
    message(FATAL_ERROR "'${begin}' not found")
  endif()
  string(SUBSTRING "${text}" ${start} -1 rest)
  string(FIND "${rest}" "\n" lineEnd)
  math(EXPR lineEnd "${lineEnd} + 1")
  string(SUBSTRING "${rest}" ${lineEnd} -1 rest)
  string(FIND "${rest}" "${end}" stop)
  if(stop EQUAL -1)
    message(FATAL_ERROR "'${end}' not found after '${begin}'")
  endif()
  string(SUBSTRING "${rest}" 0 ${stop} body)
  set(${out} "${body}" PARENT_SCOPE)
endfunction()

file(READ "${README}" readme)
file(READ "${EXAMPLE}" example)
text_between("${example}" "// ---- host example" "// ---- end of host example" compiled)

get_filename_component(readmeDir "${README}" DIRECTORY)
file(RELATIVE_PATH exampleName "${readmeDir}" "${EXAMPLE}")
string(FIND "${readme}" "${exampleName}" named)
if(named EQUAL -1)
  message(FATAL_ERROR "the README does not name ${exampleName}")
endif()
string(SUBSTRING "${readme}" ${named} -1 readme)
text_between("${readme}" "```cpp" "```" shown)

if(NOT shown STREQUAL compiled)
  file(WRITE "${WORK_DIR}/readme-example.cpp" "${shown}")
  file(WRITE "${WORK_DIR}/compiled-example.cpp" "${compiled}")
  message(FATAL_ERROR "the README's host example differs from ${EXAMPLE} between its marks: "
                      "diff ${WORK_DIR}/readme-example.cpp ${WORK_DIR}/compiled-example.cpp")
endif()
