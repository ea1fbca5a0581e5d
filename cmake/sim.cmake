# The simulated build and the tests: x86_64, run under 64-bit Wine.
if(NOT CMAKE_BUILD_TYPE)
  set(CMAKE_BUILD_TYPE RelWithDebInfo CACHE STRING "" FORCE)
endif()
set(SIM_DIR ${VISTREL_ROOT}/build/sim)
set(TEST_DIR ${CMAKE_BINARY_DIR}/tests)
set(CMAKE_ARCHIVE_OUTPUT_DIRECTORY ${CMAKE_BINARY_DIR}/lib)
set(VISTREL_STATIC_RUNTIME -static)
set(VISTREL_COMPANION_LINK_FLAGS ${VISTREL_STATIC_RUNTIME})
add_library(vistrel_runtime STATIC ${VISTREL_ROOT}/src/base/runtime_std.cpp)
target_include_directories(vistrel_runtime PRIVATE ${VISTREL_ROOT}/src)
target_compile_options(vistrel_runtime PRIVATE ${VISTREL_PROGRAM_FLAGS})

include(${VISTREL_ROOT}/cmake/companions.cmake)
set_target_properties(HookKeep gatectl loupe dxprobe PROPERTIES RUNTIME_OUTPUT_DIRECTORY ${SIM_DIR} LIBRARY_OUTPUT_DIRECTORY ${SIM_DIR})

# The program without its process entry, shared by vistrel-sim.exe and the tests.
add_library(vistrel_core STATIC ${VISTREL_PROGRAM_SOURCES})
target_include_directories(vistrel_core PUBLIC ${VISTREL_ROOT}/src ${VISTREL_ROOT}/resources ${VISTREL_ROOT}/companions)
target_compile_options(vistrel_core PRIVATE ${VISTREL_PROGRAM_FLAGS})
target_link_libraries(vistrel_core PUBLIC HookKeep vistrel_runtime ${VISTREL_SYSTEM_LIBS})

# The simulated machine beneath it.
file(GLOB VISTREL_SIM_SOURCES CONFIGURE_DEPENDS ${VISTREL_ROOT}/sim/*.cpp)
list(FILTER VISTREL_SIM_SOURCES EXCLUDE REGEX "/(simstate|boot_description)\\.cpp$")
add_library(vistrel_sim STATIC ${VISTREL_SIM_SOURCES})
target_include_directories(vistrel_sim PUBLIC ${VISTREL_ROOT}/sim ${VISTREL_ROOT}/src)
target_compile_options(vistrel_sim PRIVATE -Wall -Wextra -Wno-unused-parameter -Wno-cast-function-type)
target_link_libraries(vistrel_sim PUBLIC ${VISTREL_SYSTEM_LIBS})

# A DLL of nothing but a version resource, into folder.
function(vistrel_version_dll name source folder)
  add_library(${name} SHARED ${source})
  set_target_properties(${name} PROPERTIES LINKER_LANGUAGE C PREFIX "" RUNTIME_OUTPUT_DIRECTORY ${folder})
  target_link_options(${name} PRIVATE -nostdlib -Wl,-e,0)
endfunction()
# The display driver file the simulated installation has; the machine copies
# it from beside the running program into Windows' folders at boot.
vistrel_version_dll(simdriver ${VISTREL_ROOT}/sim/display_driver.rc ${SIM_DIR})

# The simulated gatectl.exe switches the machine of its folder on, as
# vistrel-sim.exe does, and asks that machine's display driver.
target_sources(gatectl PRIVATE ${VISTREL_ROOT}/sim/boot_description.cpp)
target_include_directories(gatectl PRIVATE ${VISTREL_ROOT}/sim)
target_link_libraries(gatectl PRIVATE vistrel_sim)

add_executable(vistrel-sim WIN32 ${VISTREL_ROOT}/src/shell/winmain.cpp ${VISTREL_ROOT}/sim/boot_description.cpp
               ${VISTREL_ROOT}/resources/vistrel.rc)
target_include_directories(vistrel-sim PRIVATE ${VISTREL_ROOT}/src ${VISTREL_ROOT}/sim ${VISTREL_ROOT}/resources)
target_compile_options(vistrel-sim PRIVATE $<$<COMPILE_LANGUAGE:CXX>:${VISTREL_PROGRAM_FLAGS}>)
target_link_options(vistrel-sim PRIVATE ${VISTREL_STATIC_RUNTIME})
# The boot object comes first so that the machine is up before the program runs.
target_link_libraries(vistrel-sim PRIVATE vistrel_core vistrel_sim)
add_dependencies(vistrel-sim simdriver)
set_target_properties(vistrel-sim PROPERTIES RUNTIME_OUTPUT_DIRECTORY ${SIM_DIR})

add_executable(simstate ${VISTREL_ROOT}/sim/simstate.cpp)
target_link_libraries(simstate PRIVATE vistrel_sim)
target_link_options(simstate PRIVATE ${VISTREL_STATIC_RUNTIME})
set_target_properties(simstate PROPERTIES RUNTIME_OUTPUT_DIRECTORY ${SIM_DIR})

# What building a long mode table costs (a benchmark, not a timed test).
add_executable(bench-modetable ${VISTREL_ROOT}/tools/bench/bench_modetable.cpp)
target_include_directories(bench-modetable PRIVATE ${VISTREL_ROOT}/tests)
target_link_libraries(bench-modetable PRIVATE vistrel_core vistrel_sim)
target_link_options(bench-modetable PRIVATE ${VISTREL_STATIC_RUNTIME})
set_target_properties(bench-modetable PROPERTIES RUNTIME_OUTPUT_DIRECTORY ${SIM_DIR})

add_custom_command(TARGET vistrel-sim POST_BUILD
  COMMAND ${CMAKE_COMMAND} -E copy ${VISTREL_INI_FILES} ${SIM_DIR})

# Tests: GoogleTest from Debian's source package, built with this compiler.
set(gtest_disable_pthreads OFF CACHE BOOL "" FORCE)
set(INSTALL_GTEST OFF CACHE BOOL "" FORCE)
set(BUILD_GMOCK OFF CACHE BOOL "" FORCE)
add_subdirectory(/usr/src/googletest ${CMAKE_BINARY_DIR}/googletest EXCLUDE_FROM_ALL)
enable_testing()
set(VISTREL_WINE_RUN ${VISTREL_ROOT}/tools/wine-run)

file(GLOB VISTREL_TEST_SUPPORT CONFIGURE_DEPENDS ${VISTREL_ROOT}/tests/support/*.cpp)
add_library(vistrel_test_support STATIC ${VISTREL_TEST_SUPPORT})
target_include_directories(vistrel_test_support PUBLIC ${VISTREL_ROOT}/tests ${VISTREL_ROOT}/src ${VISTREL_ROOT}/sim)
target_link_libraries(vistrel_test_support PUBLIC vistrel_core vistrel_sim gtest)

# vistrel_test(<folder>): one test executable for tests/<folder>/*.cpp.
function(vistrel_test folder)
  file(GLOB sources CONFIGURE_DEPENDS ${VISTREL_ROOT}/tests/${folder}/*.cpp)
  set(target test-${folder})
  add_executable(${target} ${sources})
  target_link_libraries(${target} PRIVATE vistrel_test_support gtest_main)
  target_link_options(${target} PRIVATE ${VISTREL_STATIC_RUNTIME})
  set_target_properties(${target} PROPERTIES RUNTIME_OUTPUT_DIRECTORY ${TEST_DIR})
  add_dependencies(${target} HookKeep vistrel-sim simstate)
endfunction()

# vistrel_add_test(<name> <folder> [WINDOWS <v>] [FILTER <gtest filter>] [TIMEOUT <s>])
function(vistrel_add_test name folder)
  cmake_parse_arguments(T "" "WINDOWS;FILTER;TIMEOUT" "" ${ARGN})
  set(command ${VISTREL_WINE_RUN})
  if(T_WINDOWS)
    list(APPEND command --windows ${T_WINDOWS})
  endif()
  list(APPEND command $<TARGET_FILE:test-${folder}>)
  if(T_FILTER)
    list(APPEND command --gtest_filter=${T_FILTER})
  endif()
  add_test(NAME ${name} COMMAND ${command})
  if(NOT T_TIMEOUT)
    set(T_TIMEOUT 120)
  endif()
  set_tests_properties(${name} PROPERTIES TIMEOUT ${T_TIMEOUT} ENVIRONMENT "VISTREL_SIM_DIR=${SIM_DIR}")
endfunction()

# Test executables find HookKeep.dll and the machine's driver file beside them.
add_custom_target(test-runtime ALL
  COMMAND ${CMAKE_COMMAND} -E make_directory ${TEST_DIR}
  COMMAND ${CMAKE_COMMAND} -E copy $<TARGET_FILE:HookKeep> $<TARGET_FILE:simdriver> ${TEST_DIR}
  DEPENDS HookKeep simdriver)

include(${VISTREL_ROOT}/tests/tests.cmake)

# The tour's camera and the panning dialog it photographs (tools/tour).
add_executable(tour-snap ${VISTREL_ROOT}/tools/snap/snap.cpp)
target_link_libraries(tour-snap PRIVATE comctl32 gdi32 user32 shell32 advapi32)
target_link_options(tour-snap PRIVATE ${VISTREL_STATIC_RUNTIME})
set_target_properties(tour-snap PROPERTIES RUNTIME_OUTPUT_DIRECTORY ${CMAKE_BINARY_DIR}/tools)
add_executable(tour-panning WIN32 ${VISTREL_ROOT}/tools/snap/panning.cpp ${VISTREL_ROOT}/sim/boot_description.cpp
               ${VISTREL_ROOT}/resources/vistrel.rc)
target_include_directories(tour-panning PRIVATE ${VISTREL_ROOT}/src ${VISTREL_ROOT}/sim ${VISTREL_ROOT}/resources)
target_link_libraries(tour-panning PRIVATE vistrel_core vistrel_sim)
target_link_options(tour-panning PRIVATE ${VISTREL_STATIC_RUNTIME})
set_target_properties(tour-panning PROPERTIES RUNTIME_OUTPUT_DIRECTORY ${SIM_DIR})
