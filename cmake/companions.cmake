# HookKeep.dll and gatectl.exe, built the same way for both machines.
# SetKeepHook is stdcall and exported without decoration.
add_library(HookKeep SHARED ${VISTREL_ROOT}/companions/hookkeep.cpp ${VISTREL_ROOT}/companions/hookkeep.def)
set_target_properties(HookKeep PROPERTIES PREFIX "" OUTPUT_NAME HookKeep IMPORT_PREFIX "lib" IMPORT_SUFFIX ".dll.a")
target_compile_options(HookKeep PRIVATE ${VISTREL_PROGRAM_FLAGS})
target_link_options(HookKeep PRIVATE -Wl,--kill-at ${VISTREL_COMPANION_LINK_FLAGS})
target_link_libraries(HookKeep PRIVATE user32)
target_include_directories(HookKeep PRIVATE ${VISTREL_ROOT}/companions ${VISTREL_ROOT}/src)

add_executable(gatectl WIN32 ${VISTREL_ROOT}/companions/gatectl.cpp)
target_compile_options(gatectl PRIVATE ${VISTREL_PROGRAM_FLAGS})
target_link_options(gatectl PRIVATE ${VISTREL_COMPANION_LINK_FLAGS})
target_link_libraries(gatectl PRIVATE user32 advapi32)
target_include_directories(gatectl PRIVATE ${VISTREL_ROOT}/companions ${VISTREL_ROOT}/src)
