# Checks the dynamic symbols the shared library exports: its public interface only, no
# internal name (a `detail` namespace or an anonymous one). The standard library's own
# instantiations and kora::datasources::detail::CaseInsensitiveCompare, a name the
# interface contract fixes, are allowed.
#   cmake -DLIBRARY=<libkubo.so> -DNM=<nm> -P exportedsymbols.cmake
execute_process(COMMAND ${NM} -D --defined-only -C ${LIBRARY}
  OUTPUT_VARIABLE symbols RESULT_VARIABLE result)
if(NOT result EQUAL 0)
  message(FATAL_ERROR "${NM} could not read ${LIBRARY}")
endif()
string(REPLACE "\n" ";" symbols "${symbols}")
set(internal "")
set(count 0)
foreach(line IN LISTS symbols)
  math(EXPR count "${count} + 1")
  string(REGEX REPLACE "^[0-9a-f]+ . " "" name "${line}")
  string(REGEX REPLACE "std::[^<>,]*detail" "std" name "${name}")
  string(REPLACE "kora::datasources::detail::CaseInsensitiveCompare" "" name "${name}")
  if(name MATCHES "(^|[^a-z_])detail::|anonymous namespace")
    list(APPEND internal "${line}")
  endif()
endforeach()
list(LENGTH internal found)
if(found GREATER 0)
  list(GET internal 0 first)
  message(FATAL_ERROR "${found} internal symbols exported, for example: ${first}")
endif()
if(NOT symbols MATCHES "kora::kubo::PromoteFactory::Create")
  message(FATAL_ERROR "the public interface is missing from ${LIBRARY}")
endif()
message(STATUS "${count} exported symbols, none internal")
