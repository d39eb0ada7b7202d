#ifndef QX_FRAME_TESTS_BINDING_SYSTEM_H
#define QX_FRAME_TESTS_BINDING_SYSTEM_H

// The platform-dependent functions of the probe.

void *LoadModule(const char *path);

// Intercepts and prints fatal messages on platforms that show them in a message box.
void PrintFatalMessages();

#endif
