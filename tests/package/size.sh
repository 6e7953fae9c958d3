# The shared library, stripped, stays small: below 600 KB for x86-64 with all targets and 200 KB for ARMv7.
# Prints its size, which goes in steps of 16 KiB, the pages that segments begin on.
. "$(dirname "$0")/gate.sh" "$1"

case $library_kind$build_type in
    ELFRelease) ;;
    *) skip "Only an optimised ELF library has a limit." ;;
esac
case $processor in
    x86_64 | amd64 | AMD64) limit=600000 ;;
    arm*) limit=200000 ;;
    *) skip "No limit for '$processor'." ;;
esac

"$strip" -o "$scratch/library" "$shared_library" || fault "strip does not understand the library."
size=$(wc -c <"$scratch/library")
echo "$size bytes, stripped"
[ "$size" -le $limit ] || fault "More than $limit bytes."
finish
