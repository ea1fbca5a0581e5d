# The product: i686, small, loadable on Windows 95, 98 and NT 4.0.
set(CMAKE_BUILD_TYPE Release CACHE STRING "" FORCE)
set(CMAKE_CXX_FLAGS_RELEASE "-Os -DNDEBUG")
set(CMAKE_C_FLAGS_RELEASE "-Os -DNDEBUG")
set(PRODUCT_DIR ${VISTREL_ROOT}/build/product)
set(CMAKE_RUNTIME_OUTPUT_DIRECTORY ${PRODUCT_DIR})
set(CMAKE_LIBRARY_OUTPUT_DIRECTORY ${PRODUCT_DIR})
set(CMAKE_ARCHIVE_OUTPUT_DIRECTORY ${CMAKE_BINARY_DIR}/lib)

set(VISTREL_WIN4_LINK_FLAGS -s -static-libgcc -static-libstdc++
    -Wl,--major-os-version,4 -Wl,--minor-os-version,0
    -Wl,--major-subsystem-version,4 -Wl,--minor-subsystem-version,0
    -Wl,--gc-sections)
set(VISTREL_COMPANION_LINK_FLAGS ${VISTREL_WIN4_LINK_FLAGS})
include(${VISTREL_ROOT}/cmake/companions.cmake)

add_executable(vistrel WIN32 ${VISTREL_PROGRAM_SOURCES}
               ${VISTREL_ROOT}/src/hardware/machine_x86.cpp ${VISTREL_ROOT}/src/shell/winmain.cpp
               ${VISTREL_ROOT}/resources/vistrel.rc)
target_include_directories(vistrel PRIVATE ${VISTREL_ROOT}/src ${VISTREL_ROOT}/resources ${VISTREL_ROOT}/companions)
target_compile_options(vistrel PRIVATE $<$<COMPILE_LANGUAGE:CXX>:${VISTREL_PROGRAM_FLAGS} -ffunction-sections>)
target_compile_definitions(vistrel PRIVATE VISTREL_PRODUCT=1)
target_link_options(vistrel PRIVATE ${VISTREL_WIN4_LINK_FLAGS})
target_link_libraries(vistrel PRIVATE HookKeep ${VISTREL_SYSTEM_LIBS})

add_custom_command(TARGET vistrel POST_BUILD
  COMMAND ${CMAKE_COMMAND} -E copy ${VISTREL_INI_FILES} ${PRODUCT_DIR})
