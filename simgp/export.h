/* Visibility of the public functions; both families include it. */
#ifndef SIMGP_EXPORT_H
#define SIMGP_EXPORT_H

/* The library is built with hidden visibility: a function leaves it only if its declaration carries
 * SIMGP_API and its name stands in the list that drives the linker (cmake/exports.txt).
 *
 * On Windows, programs take the functions and tables from the DLL, and those that link to the
 * static library define SIMGP_STATIC. The packages for CMake and pkg-config see to it. */
#if defined(_WIN32) && defined(SIMGP_STATIC)
#define SIMGP_API
#elif defined(_WIN32)
#define SIMGP_API __declspec(dllimport)
#elif defined(__GNUC__)
#define SIMGP_API __attribute__((visibility("default")))
#else
#define SIMGP_API
#endif

/* What C and C++ write differently: functions of C, and checks when a program is compiled. */
#ifdef __cplusplus
#define SIMGP_BEGIN_DECLS extern "C" {
#define SIMGP_END_DECLS }
#define SIMGP_STATIC_ASSERT(condition, text) static_assert(condition, text)
#else
#define SIMGP_BEGIN_DECLS
#define SIMGP_END_DECLS
#define SIMGP_STATIC_ASSERT(condition, text) _Static_assert(condition, text)
#endif

#endif
