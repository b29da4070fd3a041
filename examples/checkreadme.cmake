# Every code block of the README that follows a line "<!-- example: <path> -->" must be the
# file at <path> word for word, so the examples the README shows are the ones that are built
# and run.
file(READ ${README} text)
string(REGEX MATCHALL "<!-- example: [^ ]+ -->\n```cpp\n" markers "${text}")
list(LENGTH markers count)
if(count EQUAL 0)
  message(FATAL_ERROR "the README shows no examples")
endif()
foreach(marker IN LISTS markers)
  string(REGEX REPLACE "<!-- example: ([^ ]+) -->.*" "\\1" path "${marker}")
  file(READ ${ROOT}/${path} expected)
  string(FIND "${text}" "${marker}${expected}```" at)
  if(at EQUAL -1)
    message(FATAL_ERROR "the README's copy of ${path} differs from the file")
  endif()
endforeach()
message(STATUS "${count} README examples match their files")
