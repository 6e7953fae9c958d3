# The shared library as a loader sees it.
. "$(dirname "$0")/gate.sh" "$1"

dynamic=$("$readelf" -dW "$shared_library")
segments=$("$readelf" -lW "$shared_library")

needed=$(sed -n 's/.*(NEEDED).*\[\(.*\)\]/\1/p' <<<"$dynamic" | grep -vE '^libc\.so(\.6)?$')
[ -z "$needed" ] || fault "Needs more than the C library:" "$needed"
grep -q '(SONAME).*\[libsimgp\.so\.1\]' <<<"$dynamic" || fault "The soname is not libsimgp.so.1."
! grep -q TEXTREL <<<"$dynamic" || fault "Has text relocations."

stack=$(awk '$1 == "GNU_STACK" { print $(NF - 1) }' <<<"$segments")
[ "$stack" = RW ] || fault "The stack's flags are '$stack', not RW."
alignments=$(awk '$1 == "LOAD" { print $NF }' <<<"$segments" | sort -u)
[ "$alignments" = 0x4000 ] || fault "LOAD segments are not all aligned to 0x4000:" "$alignments"

# Nothing of ours runs at start-up, and no thread has data of ours.
started=$("$readelf" -SW "$static_library" | grep -oE '\.(init_array|ctors|preinit_array|tdata|tbss)\b')
[ -z "$started" ] || fault "Objects have start-up code or thread-local data:" "$started"

# What is asked of the C library. Allocation belongs to scmn/mem.cpp and to the resizer's creation.
allowed='memcpy|memmove|memset|memcmp|getauxval|sched_yield|abort|__stack_chk_(fail|guard)'
allowed+='|__(memcpy|memmove|memset)_chk|__cxa_finalize|__gmon_start__|_ITM_.*|__tls_get_addr'
# Where processors have no division, the compiler's own library raises the signal of a division by zero.
allowed+='|raise'
allocators='malloc|calloc|realloc|free|posix_memalign|aligned_alloc|memalign'
imports=$("$nm" -D --undefined-only "$shared_library" | awk '{ sub(/@.*/, "", $2); print $2 }' |
    grep -vxE "$allowed|$allocators")
[ -z "$imports" ] || fault "Imports that the list in elf.sh does not have:" "$imports"

for object in $objects $(cut -d ' ' -f 2- <<<"$units"); do
    case $object in */scmn/mem.cpp.* | */scmn/irsz.cpp.*) continue ;; esac
    calls=$("$nm" -u "$object" | awk '{ print $NF }' | grep -xE "$allocators|_Zn[wa].*|_Zd[la].*")
    [ -z "$calls" ] || fault "${object#"$build_dir"/} allocates:" "$calls"
done
finish
