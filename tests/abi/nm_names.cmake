# nm_names(VAR LIBRARY WHICH): the names of the dynamic symbols that LIBRARY
# defines (WHICH = --defined-only) or needs (--undefined-only), without
# their @VERSION suffixes, into VAR. Fails when nm does.
function(nm_names var library which)
  execute_process(COMMAND ${NM} -D ${which} ${library} OUTPUT_VARIABLE nm_out RESULT_VARIABLE nm_rc)
  if(NOT nm_rc EQUAL 0)
    message(FATAL_ERROR "nm failed on ${library}")
  endif()
  set(names)
  string(REPLACE "\n" ";" lines "${nm_out}")
  foreach(line IN LISTS lines)
    if(line MATCHES "^[0-9a-fA-F]* *[A-Za-z] +([^ ]+)$")
      string(REGEX REPLACE "@.*$" "" name "${CMAKE_MATCH_1}")
      list(APPEND names "${name}")
    endif()
  endforeach()
  set(${var} ${names} PARENT_SCOPE)
endfunction()
