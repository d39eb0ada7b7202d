#include "frame/tests/binding/system.h"

#include <dlfcn.h>

void *LoadModule(const char *path) { return dlopen(path, RTLD_NOW); }

void PrintFatalMessages() {} // the module prints them itself
