# One static library per module folder: its *.cpp and *.h at the top, its tests in tests/.
# Includes are written from the repository root ("platform/media/CMTime.h").

# Warnings are errors in our own targets, under both compilers. Each compiler gets the flags it
# knows: GCC's -Wshadow=local has no Clang spelling, Clang's -Wshadow-uncaptured-local is close.
function(vce_warnings target)
  target_compile_options(${target} PRIVATE
    -Wall -Wextra -Wpedantic -Wnon-virtual-dtor -Woverloaded-virtual -Wimplicit-fallthrough
    -Werror)
  if(CMAKE_CXX_COMPILER_ID STREQUAL "GNU")
    target_compile_options(${target} PRIVATE -Wshadow=local)
  elseif(CMAKE_CXX_COMPILER_ID MATCHES "Clang")
    target_compile_options(${target} PRIVATE -Wshadow-uncaptured-local -Wunreachable-code
      -Wno-gnu-zero-variadic-macro-arguments)
  endif()
endfunction()

# vce_module(<target> [INTERNAL] [COMPONENT Core|Qt] [DIRS extra folders...] [DEPS libs...]
#            [TEST_DEPS libs...])
# DIRS adds sibling folders whose code is one library with this one (two halves that call
# each other, such as the editing engine and its view). Every module ships in the installed
# package (component Core unless named) with its headers, except an INTERNAL one.
function(vce_module target)
  cmake_parse_arguments(M "INTERNAL" "COMPONENT" "DIRS;DEPS;TEST_DEPS" ${ARGN})
  if(NOT M_COMPONENT)
    set(M_COMPONENT Core)
  endif()
  set(dirs ${CMAKE_CURRENT_SOURCE_DIR})
  foreach(d ${M_DIRS})
    get_filename_component(abs ${d} ABSOLUTE BASE_DIR ${CMAKE_CURRENT_SOURCE_DIR})
    list(APPEND dirs ${abs})
  endforeach()
  set(srcs "")
  set(hdrs "")
  set(tests "")
  foreach(d ${dirs})
    file(GLOB s CONFIGURE_DEPENDS ${d}/*.cpp ${d}/internal/*.cpp)
    file(GLOB h CONFIGURE_DEPENDS ${d}/*.h ${d}/internal/*.h)
    file(GLOB t CONFIGURE_DEPENDS ${d}/tests/*.cpp)
    list(APPEND srcs ${s})
    list(APPEND hdrs ${h})
    list(APPEND tests ${t})
  endforeach()
  # Includes are written from the root in the tree and from the package's include folder
  # once installed.
  set(include_dirs $<BUILD_INTERFACE:${PROJECT_SOURCE_DIR}>
                   $<INSTALL_INTERFACE:${VCE_INSTALL_INCLUDEDIR}>)
  if(srcs)
    add_library(${target} STATIC ${srcs} ${hdrs})
    target_include_directories(${target} PUBLIC ${include_dirs})
    target_link_libraries(${target} PUBLIC ${M_DEPS})
    vce_warnings(${target})
  else()
    add_library(${target} INTERFACE ${hdrs})
    target_include_directories(${target} INTERFACE ${include_dirs})
    target_link_libraries(${target} INTERFACE ${M_DEPS})
  endif()
  add_library(vce::${target} ALIAS ${target})

  if(NOT M_INTERNAL)
    set_property(GLOBAL APPEND PROPERTY VCE_PACKAGE_${M_COMPONENT}_TARGETS ${target})
    foreach(d ${dirs})
      file(RELATIVE_PATH rel ${PROJECT_SOURCE_DIR} ${d})
      file(GLOB h CONFIGURE_DEPENDS ${d}/*.h)
      file(GLOB hi CONFIGURE_DEPENDS ${d}/internal/*.h)
      install(FILES ${h} DESTINATION ${VCE_INSTALL_INCLUDEDIR}/${rel} COMPONENT ${M_COMPONENT})
      if(hi)
        install(FILES ${hi} DESTINATION ${VCE_INSTALL_INCLUDEDIR}/${rel}/internal
                COMPONENT ${M_COMPONENT})
      endif()
    endforeach()
  endif()

  if(VCE_BUILD_TESTS)
    if(tests)
      add_executable(${target}_tests ${tests})
      target_link_libraries(${target}_tests PRIVATE
        ${target} ${M_TEST_DEPS} GTest::gtest_main GTest::gmock)
      target_include_directories(${target}_tests PRIVATE ${PROJECT_SOURCE_DIR})
      vce_warnings(${target}_tests)
      gtest_discover_tests(${target}_tests DISCOVERY_MODE PRE_TEST
        PROPERTIES ENVIRONMENT "VCE_SOURCE_DIR=${PROJECT_SOURCE_DIR}"
                   ENVIRONMENT_MODIFICATION "QT_QPA_PLATFORM=set:offscreen")
    endif()
  endif()
endfunction()
