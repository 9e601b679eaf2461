# pictavo_module(NAME GLOBS pattern... [EXCLUDE pattern...] DEPS target...)
#
# One library per rung of the module ladder. Sources are found by the glob
# patterns (relative to the source root), so adding a file needs no CMake edit.
# A rung without sources yet is an interface library that forwards its deps.
function(pictavo_module name)
  cmake_parse_arguments(M "" "" "GLOBS;DEPS;EXCLUDE" ${ARGN})
  set(sources "")
  foreach(pattern IN LISTS M_GLOBS)
    file(GLOB found CONFIGURE_DEPENDS ${CMAKE_SOURCE_DIR}/${pattern})
    list(APPEND sources ${found})
  endforeach()
  foreach(pattern IN LISTS M_EXCLUDE)
    file(GLOB found CONFIGURE_DEPENDS ${CMAKE_SOURCE_DIR}/${pattern})
    if(found)
      list(REMOVE_ITEM sources ${found})
    endif()
  endforeach()
  set(target pictavo_${name})
  if(sources)
    add_library(${target} STATIC ${sources})
    target_include_directories(${target} PUBLIC ${CMAKE_SOURCE_DIR})
    target_link_libraries(${target} PUBLIC ${M_DEPS})
    target_compile_definitions(${target} PRIVATE
      PICTAVO_RES_BUILD_DIR="${PICTAVO_RES_BUILD_DIR}"
      PICTAVO_RES_INSTALL_DIR="${PICTAVO_RES_INSTALL_DIR}")
  else()
    add_library(${target} INTERFACE)
    target_include_directories(${target} INTERFACE ${CMAKE_SOURCE_DIR})
    target_link_libraries(${target} INTERFACE ${M_DEPS})
  endif()
endfunction()

# pictavo_test_area(DIR): every tests/DIR/*.cpp forms one GoogleTest program
# "test_DIR", run headless on the buffer engine by CTest. It links the rung of
# the same name (tests/model links pictavo_model) or, if none, the whole app,
# so a rung's tests build without the rungs below it.
function(pictavo_test_area dir)
  file(GLOB sources CONFIGURE_DEPENDS ${CMAKE_CURRENT_SOURCE_DIR}/${dir}/*.cpp)
  if(NOT sources)
    return()
  endif()
  set(target test_${dir})
  string(REPLACE "-" "_" target ${target})
  add_executable(${target} ${sources})
  set(rung pictavo_${dir})
  string(REPLACE "-" "" rung ${rung})
  if(NOT TARGET ${rung})
    set(rung pictavo_app)
  endif()
  target_link_libraries(${target} PRIVATE pictavo_test_support ${rung})
  add_test(NAME ${dir} COMMAND ${target})
  set_tests_properties(${dir} PROPERTIES TIMEOUT 600
    ENVIRONMENT "ELM_ENGINE=buffer;ECORE_NO_SYSTEM_MODULES=1;EINA_LOG_BACKTRACE=-1;PICTAVO_LOG_LEVEL=E;PICTAVO_RES_DIR=${PICTAVO_RES_BUILD_DIR};PICTAVO_TEST_DATA=${CMAKE_CURRENT_BINARY_DIR}/data;HOME=${CMAKE_CURRENT_BINARY_DIR}/home;XDG_DATA_HOME=${CMAKE_CURRENT_BINARY_DIR}/home/data;XDG_PICTURES_DIR=${CMAKE_CURRENT_BINARY_DIR}/home/Pictures;ASAN_OPTIONS=detect_leaks=0")
  add_dependencies(${target} pictavo_resources)
endfunction()
