# Test executables (one per folder) and the runs CTest makes of them.
vistrel_test(shell)
vistrel_add_test(shell shell)
vistrel_test(sim)
vistrel_add_test(sim sim)
vistrel_test(adjust)
# The panning dialog's template and pictures are resources of the program.
target_sources(test-adjust PRIVATE ${VISTREL_ROOT}/resources/vistrel.rc)
vistrel_add_test(adjust adjust)
