# Writes an entry of ctest for each suite of a test program, whose tests follow each other in one process:
# -D PROGRAM=COMMAND -D LEFT_OUT=PATTERN -D FILE=FILE
cmake_minimum_required(VERSION 3.25)
list(REMOVE_ITEM PROGRAM "")
set(left_out "")
if(LEFT_OUT)
  set(left_out ":-${LEFT_OUT}")
endif()
execute_process(COMMAND ${PROGRAM} --gtest_list_tests --gtest_filter=*${left_out}
  OUTPUT_VARIABLE listed COMMAND_ERROR_IS_FATAL ANY TIMEOUT 120)
string(REPLACE ";" "," listed "${listed}")
string(REPLACE "\n" ";" listed "${listed}")
set(suite "")
foreach(line IN LISTS listed)
  if(line MATCHES "^([A-Za-z0-9_/]+)\\.( |$)")
    set(suite ${CMAKE_MATCH_1})
    list(APPEND suites ${suite})
  elseif(suite AND line MATCHES "^  ")
    math(EXPR tests_${suite} "${tests_${suite}} + 1")
  endif()
endforeach()
if(NOT suites)
  message(FATAL_ERROR "${PROGRAM} lists no tests")
endif()

# The largest ones begin first, lest one of them is left to the end.
list(JOIN PROGRAM "]==] [==[" command)
set(entries "")
foreach(suite IN LISTS suites)
  string(APPEND entries "add_test([==[${suite}]==] [==[${command}]==] [==[--gtest_filter=${suite}.*${left_out}]==])\n"
    "set_tests_properties([==[${suite}]==] PROPERTIES TIMEOUT 1200 COST ${tests_${suite}})\n")
endforeach()
file(WRITE ${FILE} "${entries}")
