# cmake -D NM=... -D LIBRARY=file -D LIST=file [-D UPDATE=ON] -P CheckSymbols.cmake
# Fails when the symbols that LIBRARY exports differ from those in LIST; with UPDATE, writes LIST anew.
execute_process(
  COMMAND ${NM} -D --defined-only ${LIBRARY}
  OUTPUT_VARIABLE output
  COMMAND_ERROR_IS_FATAL ANY)
string(REGEX MATCHALL "[^ \n]+\n" symbols "${output}")
list(TRANSFORM symbols STRIP)
list(SORT symbols)

if(UPDATE)
  list(JOIN symbols "\n" text)
  file(WRITE ${LIST} "# To bring the lists in line with the build: cmake --build --preset <preset> --target update-symbols\n${text}\n")
  return()
endif()

file(STRINGS ${LIST} expected REGEX "^[^#]")
set(missing ${expected})
list(REMOVE_ITEM missing ${symbols})
set(unexpected ${symbols})
list(REMOVE_ITEM unexpected ${expected})
if(missing OR unexpected)
  message(FATAL_ERROR "${LIBRARY} does not export what ${LIST} says.\n"
                      "missing: ${missing}\nunexpected: ${unexpected}\n"
                      "When that is meant: cmake --build --preset <preset> --target update-symbols")
endif()
