# Test executables (one per folder) and the runs CTest makes of them.
vistrel_test(shell)
vistrel_add_test(shell shell)
vistrel_test(sim)
vistrel_add_test(sim sim)
