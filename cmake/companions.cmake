# The companions, built the same way for both machines; each carries the
# version resource of resources/version.rc2.
set_source_files_properties(${VISTREL_ROOT}/companions/hookkeep.rc
                            PROPERTIES OBJECT_DEPENDS ${VISTREL_ROOT}/resources/version.rc2)
# SetKeepHook is stdcall and exported without decoration (--kill-at).
add_library(HookKeep SHARED ${VISTREL_ROOT}/companions/hookkeep.cpp ${VISTREL_ROOT}/companions/keep_call.cpp
            ${VISTREL_ROOT}/companions/hookkeep.def ${VISTREL_ROOT}/companions/hookkeep.rc)
set_target_properties(HookKeep PROPERTIES PREFIX "" OUTPUT_NAME HookKeep IMPORT_PREFIX "lib" IMPORT_SUFFIX ".dll.a")
target_compile_options(HookKeep PRIVATE $<$<COMPILE_LANGUAGE:CXX>:${VISTREL_PROGRAM_FLAGS} ${VISTREL_CODE_FLAGS}>)
target_link_options(HookKeep PRIVATE -Wl,--kill-at ${VISTREL_COMPANION_LINK_FLAGS} ${VISTREL_DLL_ENTRY})
target_link_libraries(HookKeep PRIVATE vistrel_runtime user32 ${VISTREL_RUNTIME_LIBS})
target_include_directories(HookKeep PRIVATE ${VISTREL_ROOT}/companions ${VISTREL_ROOT}/src ${VISTREL_ROOT}/resources)
if(CMAKE_SIZEOF_VOID_P EQUAL 4)
  # ld's import library carries the killed name too, where a 32-bit caller
  # looks for _SetKeepHook@16; dlltool -k keeps the decoration for the
  # caller and the plain name for the loader.
  add_custom_command(TARGET HookKeep POST_BUILD
    COMMAND ${CMAKE_DLLTOOL} -k -d ${VISTREL_ROOT}/companions/hookkeep.def -l $<TARGET_LINKER_FILE:HookKeep>)
endif()

# A companion program: its sources, its icon (or none) and the system
# libraries it links besides the runtime.
function(vistrel_companion name icon)
  cmake_parse_arguments(C "" "" "SOURCES;LIBS" ${ARGN})
  add_executable(${name} WIN32 ${C_SOURCES} ${VISTREL_ROOT}/companions/${name}.rc)
  set_source_files_properties(${VISTREL_ROOT}/companions/${name}.rc PROPERTIES
                              OBJECT_DEPENDS "${icon};${VISTREL_ROOT}/resources/version.rc2")
  target_compile_options(${name} PRIVATE $<$<COMPILE_LANGUAGE:CXX>:${VISTREL_PROGRAM_FLAGS} ${VISTREL_CODE_FLAGS}>)
  target_link_options(${name} PRIVATE ${VISTREL_COMPANION_LINK_FLAGS} ${VISTREL_EXE_ENTRY})
  target_link_libraries(${name} PRIVATE vistrel_runtime ${C_LIBS} ${VISTREL_RUNTIME_LIBS})
  target_include_directories(${name} PRIVATE ${VISTREL_ROOT}/companions ${VISTREL_ROOT}/src ${VISTREL_ROOT}/resources)
endfunction()

# gatectl.exe asks the display driver about its memory through the machine
# seam: the real PC's here, the simulated machine's in the sim build.
vistrel_companion(gatectl "" SOURCES ${VISTREL_ROOT}/companions/gatectl.cpp ${VISTREL_ROOT}/companions/gate.cpp
                  ${VISTREL_ROOT}/companions/gate_command.cpp ${VISTREL_ROOT}/src/hardware/shutdown.cpp
                  ${VISTREL_GATE_MACHINE} LIBS user32 gdi32 advapi32)
# loupe.exe, the zoom tool the menu starts; its icon is the menu's magnifier.
vistrel_companion(loupe ${VISTREL_ROOT}/resources/zoom.ico
                  SOURCES ${VISTREL_ROOT}/companions/loupe.cpp ${VISTREL_ROOT}/companions/loupe_command.cpp
                  LIBS user32 gdi32)
# dxprobe.exe, the DirectX information tool the menu starts. DirectDraw is
# loaded at run time; dxguid holds only the interface ids.
vistrel_companion(dxprobe ${VISTREL_ROOT}/resources/directx.ico
                  SOURCES ${VISTREL_ROOT}/companions/dxprobe.cpp ${VISTREL_ROOT}/companions/dxprobe_lines.cpp
                  LIBS user32 gdi32 version dxguid)
