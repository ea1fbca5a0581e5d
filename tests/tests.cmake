# Test executables (one per folder) and the runs CTest makes of them.
vistrel_test(shell)
# The tray menu's icons and the panning dialog are resources of the program.
target_sources(test-shell PRIVATE ${VISTREL_ROOT}/resources/vistrel.rc)
vistrel_add_test(shell shell)

# The product's runtime body, built for this machine without a C runtime,
# held against the standard body.
vistrel_test(base)
add_library(runtime-win32 SHARED ${VISTREL_ROOT}/src/base/runtime_win32.cpp ${VISTREL_ROOT}/tests/base/body/runtime_body.cpp)
target_include_directories(runtime-win32 PRIVATE ${VISTREL_ROOT}/src)
target_compile_options(runtime-win32 PRIVATE ${VISTREL_PROGRAM_FLAGS} -fno-builtin)
target_link_options(runtime-win32 PRIVATE -nostdlib -Wl,-e,BodyEntry)
target_link_libraries(runtime-win32 PRIVATE kernel32 user32 gcc)
set_target_properties(runtime-win32 PROPERTIES PREFIX "" RUNTIME_OUTPUT_DIRECTORY ${TEST_DIR})
add_dependencies(test-base runtime-win32)
vistrel_add_test(base base)

# The product's files load on Windows 95, 98 and NT 4.0.
add_test(NAME product-pe COMMAND ${VISTREL_ROOT}/tools/check-product-pe ${VISTREL_ROOT}/build/product ${VISTREL_ROOT}/build/cmake-product)

vistrel_test(chips)
vistrel_add_test(chips chips)
vistrel_test(modes)
target_compile_definitions(test-modes PRIVATE VISTREL_RESOURCES="${VISTREL_ROOT}/resources")
vistrel_add_test(modes modes)

# vistrel-sim.exe as a process of its own, seen from outside.
vistrel_test(system)
target_compile_definitions(test-system PRIVATE VISTREL_MACHINES="${VISTREL_ROOT}/sim/machines")
vistrel_add_test(system system TIMEOUT 600)

vistrel_test(hardware)
vistrel_add_test(hardware hardware)

# The simulated machine's own devices.
vistrel_test(sim)
vistrel_add_test(sim sim)

# The companions: gatectl.exe's work is linked in and driven in-process; two
# helper programs stand in for gatectl.exe and for another process's window.
vistrel_test(companions)
target_sources(test-companions PRIVATE ${VISTREL_ROOT}/companions/gate.cpp ${VISTREL_ROOT}/companions/gate_command.cpp ${VISTREL_ROOT}/companions/keep_call.cpp)
foreach(helper fake_gatectl input_window)
  string(REPLACE "_" "-" helper_name ${helper})
  add_executable(${helper_name} WIN32 ${VISTREL_ROOT}/tests/companions/helpers/${helper}.cpp)
  target_link_options(${helper_name} PRIVATE ${VISTREL_STATIC_RUNTIME})
  set_target_properties(${helper_name} PROPERTIES RUNTIME_OUTPUT_DIRECTORY ${TEST_DIR})
  add_dependencies(test-companions ${helper_name})
endforeach()
add_dependencies(test-companions gatectl)
vistrel_add_test(companions companions)
vistrel_add_test(companions-95 companions WINDOWS 95 FILTER Gatectl.Restart*:GateCompanion.Restart*)
# Global hooks hear every process of the Wine session: no other test may
# type or move the mouse meanwhile.
set_tests_properties(companions companions-95 PROPERTIES RUN_SERIAL TRUE)

# The benchmark runs, and on NT builds the table from one walk of the list.
add_test(NAME bench-modetable COMMAND ${VISTREL_WINE_RUN} ${SIM_DIR}/bench-modetable.exe)
set_tests_properties(bench-modetable PROPERTIES PASS_REGULAR_EXPRESSION "platform=NT modes=100 walks=1 ")

# The adjustment window and the panning dialog; the dialog's template and
# pictures are resources of the program.
vistrel_test(adjust)
target_sources(test-adjust PRIVATE ${VISTREL_ROOT}/resources/vistrel.rc)
vistrel_add_test(adjust adjust)

# The property pages and what they show; the pages' templates, icons and
# animation are resources of the program.
vistrel_test(pages)
target_sources(test-pages PRIVATE ${VISTREL_ROOT}/resources/vistrel.rc)
target_compile_definitions(test-pages PRIVATE VISTREL_TEST_DATA="${VISTREL_ROOT}/tests/data"
                           VISTREL_RESOURCES="${VISTREL_ROOT}/resources")
# Files with nothing but a version resource, named by the language blocks of strings they have.
vistrel_version_dll(version-ansi-unicode ${VISTREL_ROOT}/tests/data/version_only.rc ${TEST_DIR})
target_compile_definitions(version-ansi-unicode PRIVATE ANSI_BLOCK UNICODE_BLOCK)
vistrel_version_dll(version-unicode ${VISTREL_ROOT}/tests/data/version_only.rc ${TEST_DIR})
target_compile_definitions(version-unicode PRIVATE UNICODE_BLOCK)
vistrel_version_dll(version-none ${VISTREL_ROOT}/tests/data/version_only.rc ${TEST_DIR})
add_dependencies(test-pages version-ansi-unicode version-unicode version-none test-runtime)
vistrel_add_test(pages pages)

# loupe.exe's command line and screen part and dxprobe.exe's lines, linked
# into the companions' tests; the real dxprobe.exe runs beside them.
target_sources(test-companions PRIVATE ${VISTREL_ROOT}/companions/loupe_command.cpp
               ${VISTREL_ROOT}/companions/dxprobe_lines.cpp)
add_dependencies(test-companions dxprobe)
# The version resources of the product's files, read beside the simulated build's.
target_compile_definitions(test-companions PRIVATE VISTREL_PRODUCT_DIR="Z:${VISTREL_ROOT}/build/product")
