# Writes the dynamic symbols that LIBRARY defines to OUTPUT, one name per line.
include(${CMAKE_CURRENT_LIST_DIR}/nm_names.cmake)
nm_names(names ${LIBRARY} --defined-only)
list(REMOVE_DUPLICATES names)
string(REPLACE ";" "\n" text "${names}")
file(WRITE ${OUTPUT} "${text}\n")
