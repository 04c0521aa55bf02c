# One static library per module folder: its *.cpp and *.h at the top, its tests in tests/.
# Includes are written from the repository root ("platform/media/CMTime.h").

function(vce_warnings target)
  target_compile_options(${target} PRIVATE
    -Wall -Wextra -Wpedantic -Wshadow=local -Wnon-virtual-dtor -Woverloaded-virtual
    -Wimplicit-fallthrough -Werror)
endfunction()

# vce_module(<target> [DEPS libs...] [TEST_DEPS libs...])
function(vce_module target)
  cmake_parse_arguments(M "" "" "DEPS;TEST_DEPS" ${ARGN})
  file(GLOB srcs CONFIGURE_DEPENDS
    ${CMAKE_CURRENT_SOURCE_DIR}/*.cpp ${CMAKE_CURRENT_SOURCE_DIR}/internal/*.cpp)
  file(GLOB hdrs CONFIGURE_DEPENDS
    ${CMAKE_CURRENT_SOURCE_DIR}/*.h ${CMAKE_CURRENT_SOURCE_DIR}/internal/*.h)
  if(srcs)
    add_library(${target} STATIC ${srcs} ${hdrs})
    target_include_directories(${target} PUBLIC ${PROJECT_SOURCE_DIR})
    target_link_libraries(${target} PUBLIC ${M_DEPS})
    vce_warnings(${target})
  else()
    add_library(${target} INTERFACE ${hdrs})
    target_include_directories(${target} INTERFACE ${PROJECT_SOURCE_DIR})
    target_link_libraries(${target} INTERFACE ${M_DEPS})
  endif()
  add_library(vce::${target} ALIAS ${target})

  if(VCE_BUILD_TESTS)
    file(GLOB tests CONFIGURE_DEPENDS ${CMAKE_CURRENT_SOURCE_DIR}/tests/*.cpp)
    if(tests)
      add_executable(${target}_tests ${tests})
      target_link_libraries(${target}_tests PRIVATE
        ${target} ${M_TEST_DEPS} GTest::gtest_main GTest::gmock)
      target_include_directories(${target}_tests PRIVATE ${PROJECT_SOURCE_DIR})
      vce_warnings(${target}_tests)
      gtest_discover_tests(${target}_tests DISCOVERY_MODE PRE_TEST
        PROPERTIES ENVIRONMENT "VCE_SOURCE_DIR=${PROJECT_SOURCE_DIR}")
    endif()
  endif()
endfunction()
