# Test executables (one per folder) and the runs CTest makes of them.
vistrel_test(shell)
vistrel_add_test(shell shell FILTER -DetectSystem.*)
foreach(version 95 98 NT4 modern)
  vistrel_add_test(shell-detect-${version} shell WINDOWS ${version} FILTER DetectSystem.*)
  set_property(TEST shell-detect-${version} APPEND PROPERTY ENVIRONMENT VISTREL_EXPECT_WINDOWS=${version})
endforeach()

# The product's files load on Windows 95, 98 and NT 4.0.
add_test(NAME product-pe COMMAND ${VISTREL_ROOT}/tools/check-product-pe ${VISTREL_ROOT}/build/product)

vistrel_test(chips)
vistrel_add_test(chips chips)
vistrel_test(modes)
vistrel_add_test(modes modes)

# vistrel-sim.exe as a process of its own, seen from outside.
vistrel_test(system)
vistrel_add_test(system system TIMEOUT 600)

vistrel_test(hardware)
vistrel_add_test(hardware hardware)

# The simulated machine's own devices.
vistrel_test(sim)
vistrel_add_test(sim sim)
