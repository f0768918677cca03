# The translator family in the build: one line per unit,
#
#   tavik_add_translator(<block> [SOURCES <further sources of the unit>])
#
# adds tavik/iq/zel/translators/<block>_online_translator.cc (and the further sources, relative to
# that folder) to the library, <block>_online_translator_test.cc beside it to the translators'
# test program, and bench/translators/<block>_translator_bench.cc to the translators' benchmark
# program. The lists are gathered in global properties, read where those targets are made.

function(tavik_add_translator block)
  cmake_parse_arguments(ARG "" "" "SOURCES" ${ARGN})
  set(dir ${PROJECT_SOURCE_DIR}/tavik/iq/zel/translators)
  set(unit ${dir}/${block}_online_translator)
  set(test ${unit}_test.cc)
  set(bench ${PROJECT_SOURCE_DIR}/bench/translators/${block}_translator_bench.cc)
  foreach(file ${unit}.h ${unit}.cc ${test} ${bench})
    if(NOT EXISTS ${file})
      message(FATAL_ERROR "tavik_add_translator(${block}): a translator unit has a header, a "
                          "source, a test and a benchmark; ${file} is missing")
    endif()
  endforeach()
  list(TRANSFORM ARG_SOURCES PREPEND ${dir}/)
  set_property(GLOBAL APPEND PROPERTY TAVIK_TRANSLATOR_SOURCES ${unit}.cc ${ARG_SOURCES})
  set_property(GLOBAL APPEND PROPERTY TAVIK_TRANSLATOR_TESTS ${test})
  set_property(GLOBAL APPEND PROPERTY TAVIK_TRANSLATOR_BENCHMARKS ${bench})
endfunction()
