# Compiler settings shared by every target of the tree.

find_program(CCACHE_PROGRAM ccache)
if(CCACHE_PROGRAM)
  set(CMAKE_CXX_COMPILER_LAUNCHER "${CCACHE_PROGRAM}")
endif()

# Warnings for our own code; generated protobuf sources get the defaults.
set(TAVIK_WARNING_FLAGS -Wall -Wextra)
if(TAVIK_WERROR)
  list(APPEND TAVIK_WARNING_FLAGS -Werror)
endif()

if(TAVIK_BUILD_FUZZERS)
  # Fuzzing builds everything with coverage for libFuzzer and with the sanitizers that turn bad
  # input into findings.
  set(TAVIK_SANITIZE "address")
  add_compile_options(-fsanitize=fuzzer-no-link)
endif()

if(TAVIK_SANITIZE STREQUAL "address")
  add_compile_options(-fsanitize=address,undefined -fno-sanitize-recover=undefined
                      -fno-omit-frame-pointer)
  add_link_options(-fsanitize=address,undefined)
elseif(TAVIK_SANITIZE STREQUAL "thread")
  add_compile_options(-fsanitize=thread -fno-omit-frame-pointer)
  add_link_options(-fsanitize=thread)
elseif(NOT TAVIK_SANITIZE STREQUAL "")
  message(FATAL_ERROR "TAVIK_SANITIZE must be empty, 'address' or 'thread', not '${TAVIK_SANITIZE}'")
endif()

# Applies the tree's warning flags to a target of our own code.
function(tavik_target_warnings target)
  target_compile_options(${target} PRIVATE ${TAVIK_WARNING_FLAGS})
endfunction()

# Links the whole static archive of the library into `target`. Tools and tests find schemas by
# name at run time (Any type URLs, text format), so every generated file must be linked in, even
# those that no code of theirs refers to.
# Libraries of ours that build on the static archive link tavik_iq_zel_whole (defined beside the
# library) for the same reason, so that the archive is always linked the one way.
function(tavik_link_whole_library target)
  target_link_libraries(${target} PRIVATE tavik_iq_zel_whole)
endfunction()
