# The product: i686, small, loadable on Windows 95, 98 and NT 4.0.
set(CMAKE_BUILD_TYPE Release CACHE STRING "" FORCE)
set(CMAKE_CXX_FLAGS_RELEASE "-Os -DNDEBUG")
set(CMAKE_C_FLAGS_RELEASE "-Os -DNDEBUG")
set(PRODUCT_DIR ${VISTREL_ROOT}/build/product)
set(CMAKE_RUNTIME_OUTPUT_DIRECTORY ${PRODUCT_DIR})
set(CMAKE_LIBRARY_OUTPUT_DIRECTORY ${PRODUCT_DIR})
set(CMAKE_ARCHIVE_OUTPUT_DIRECTORY ${CMAKE_BINARY_DIR}/lib)

# No C runtime: a retail Windows 95 has no msvcrt.dll. The programs start at
# the runtime's own entry and take the little they need from KERNEL32 and
# USER32; libgcc (64-bit division, stack probes) is linked in, not a DLL.
# Nothing may need start-up code: no static constructors, no guarded
# statics, no unwind tables.
set(VISTREL_CODE_FLAGS -fno-threadsafe-statics -fno-asynchronous-unwind-tables -fno-unwind-tables -ffunction-sections)
set(VISTREL_RUNTIME_LIBS kernel32 gcc)
set(VISTREL_EXE_ENTRY -Wl,-e,_ProgramEntry)
set(VISTREL_DLL_ENTRY -Wl,-e,_DllMain@12)
add_library(vistrel_runtime STATIC ${VISTREL_ROOT}/src/base/runtime_win32.cpp)
target_include_directories(vistrel_runtime PRIVATE ${VISTREL_ROOT}/src)
target_compile_options(vistrel_runtime PRIVATE ${VISTREL_PROGRAM_FLAGS} ${VISTREL_CODE_FLAGS} -fno-builtin)

set(VISTREL_WIN4_LINK_FLAGS -s -nostdlib
    -Wl,--major-os-version,4 -Wl,--minor-os-version,0
    -Wl,--major-subsystem-version,4 -Wl,--minor-subsystem-version,0
    -Wl,--gc-sections)
set(VISTREL_COMPANION_LINK_FLAGS ${VISTREL_WIN4_LINK_FLAGS})
set(VISTREL_GATE_MACHINE ${VISTREL_ROOT}/src/hardware/machine_x86.cpp)
include(${VISTREL_ROOT}/cmake/companions.cmake)

add_executable(vistrel WIN32 ${VISTREL_PROGRAM_SOURCES}
               ${VISTREL_ROOT}/src/hardware/machine_x86.cpp ${VISTREL_ROOT}/src/shell/winmain.cpp
               ${VISTREL_ROOT}/resources/vistrel.rc)
target_include_directories(vistrel PRIVATE ${VISTREL_ROOT}/src ${VISTREL_ROOT}/resources ${VISTREL_ROOT}/companions)
target_compile_options(vistrel PRIVATE $<$<COMPILE_LANGUAGE:CXX>:${VISTREL_PROGRAM_FLAGS} ${VISTREL_CODE_FLAGS}>)
target_compile_definitions(vistrel PRIVATE VISTREL_PRODUCT=1)
target_link_options(vistrel PRIVATE ${VISTREL_WIN4_LINK_FLAGS} ${VISTREL_EXE_ENTRY})
target_link_libraries(vistrel PRIVATE HookKeep vistrel_runtime ${VISTREL_SYSTEM_LIBS} ${VISTREL_RUNTIME_LIBS})

add_custom_command(TARGET vistrel POST_BUILD
  COMMAND ${CMAKE_COMMAND} -E copy ${VISTREL_INI_FILES} ${PRODUCT_DIR})
