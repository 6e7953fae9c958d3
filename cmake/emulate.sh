#!/bin/sh
# Runs a test program as it is, or on the emulated processor that SIMGP_EMULATE names:
#   SIMGP_EMULATE="qemu-x86_64 -cpu Conroe" ctest --test-dir build/host
# So one build serves the machine's own processor and the older models.
exec ${SIMGP_EMULATE:-} "$@"
