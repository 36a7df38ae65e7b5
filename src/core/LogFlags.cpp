// Weak, so that a host's logging library may define the flags, and a host without one still links.

#include <VornJsonDbApi.h>

__attribute__((weak)) bool blLogToStdout = false;
__attribute__((weak)) bool blDebugOutput = false;
