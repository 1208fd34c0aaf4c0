# Options shared by every target of the project.
add_library(kr_compile_options INTERFACE)
target_compile_options(kr_compile_options INTERFACE -Wall -Wextra)
# GCC 12 reports false -Wrestrict positives inside std::string concatenation at -O3 (GCC bug 105329).
if(CMAKE_CXX_COMPILER_ID STREQUAL "GNU" AND CMAKE_CXX_COMPILER_VERSION VERSION_LESS 13)
  target_compile_options(kr_compile_options INTERFACE -Wno-restrict)
endif()
if(KR_WARNINGS_AS_ERRORS)
  target_compile_options(kr_compile_options INTERFACE -Werror)
endif()
# Log lines carry source paths relative to the repository root: __FILE__ is written without it, which also
# keeps the compiler's command lines the same in every checkout.
target_compile_options(kr_compile_options INTERFACE -fmacro-prefix-map=${CMAKE_SOURCE_DIR}/=)

if(KR_SANITIZE STREQUAL "asan")
  target_compile_options(kr_compile_options INTERFACE -fsanitize=address,undefined -fno-omit-frame-pointer -fno-sanitize-recover=undefined)
  target_link_options(kr_compile_options INTERFACE -fsanitize=address,undefined)
elseif(KR_SANITIZE STREQUAL "tsan")
  target_compile_options(kr_compile_options INTERFACE -fsanitize=thread -fno-omit-frame-pointer)
  target_link_options(kr_compile_options INTERFACE -fsanitize=thread)
elseif(NOT KR_SANITIZE STREQUAL "")
  message(FATAL_ERROR "Unknown KR_SANITIZE value '${KR_SANITIZE}'")
endif()

# While developing, KR_SOURCE_FILTER (a regular expression) limits the libraries and tests to the
# matching files, so that one part builds while another is half written. Empty: everything.
set(KR_SOURCE_FILTER "" CACHE STRING "Build only sources whose file name matches this regular expression")
function(kr_filter_sources var)
  if(NOT KR_SOURCE_FILTER STREQUAL "")
    list(FILTER ${var} INCLUDE REGEX "/(${KR_SOURCE_FILTER})[^/]*$")
  endif()
  set(${var} ${${var}} PARENT_SCOPE)
endfunction()

# kr_add_layer(NAME DEPENDS...): one static library from the sources of the current folder.
function(kr_add_layer name)
  file(GLOB sources CONFIGURE_DEPENDS ${CMAKE_CURRENT_SOURCE_DIR}/*.cpp)
  kr_filter_sources(sources)
  if(sources)
    add_library(${name} STATIC ${sources})
    target_include_directories(${name} PUBLIC ${CMAKE_CURRENT_SOURCE_DIR}/..)
    target_link_libraries(${name} PUBLIC kr_compile_options ${ARGN})
  else()
    add_library(${name} INTERFACE)
    target_include_directories(${name} INTERFACE ${CMAKE_CURRENT_SOURCE_DIR}/..)
    target_link_libraries(${name} INTERFACE kr_compile_options ${ARGN})
  endif()
endfunction()
