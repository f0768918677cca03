# Generation of C++ from .proto files: imports and generated paths are written from the repository
# root ("tavik/iq/protos/common.pb.h"), into <build>/generated.

set(TAVIK_GENERATED_DIR ${PROJECT_BINARY_DIR}/generated)

# tavik_generate_protos(<sources variable> <headers variable> <proto files...>)
function(tavik_generate_protos sources_var headers_var)
  set(sources)
  set(headers)
  foreach(proto ${ARGN})
    file(RELATIVE_PATH relative ${PROJECT_SOURCE_DIR} ${proto})
    string(REGEX REPLACE "\\.proto$" "" stem ${relative})
    set(source ${TAVIK_GENERATED_DIR}/${stem}.pb.cc)
    set(header ${TAVIK_GENERATED_DIR}/${stem}.pb.h)
    add_custom_command(
      OUTPUT ${source} ${header}
      COMMAND ${CMAKE_COMMAND} -E make_directory ${TAVIK_GENERATED_DIR}
      COMMAND protobuf::protoc -I ${PROJECT_SOURCE_DIR} --cpp_out ${TAVIK_GENERATED_DIR}
              ${relative}
      WORKING_DIRECTORY ${PROJECT_SOURCE_DIR}
      DEPENDS ${ARGN} protobuf::protoc
      COMMENT "protoc ${relative}"
      VERBATIM)
    list(APPEND sources ${source})
    list(APPEND headers ${header})
  endforeach()
  set(${sources_var} ${sources} PARENT_SCOPE)
  set(${headers_var} ${headers} PARENT_SCOPE)
endfunction()
