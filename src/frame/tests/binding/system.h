#ifndef QX_FRAME_TESTS_BINDING_SYSTEM_H
#define QX_FRAME_TESTS_BINDING_SYSTEM_H

// What the probe needs of its platform.

void *LoadModule(const char *path);

// Where a fatal message is a box on the screen, it is intercepted and printed.
void PrintFatalMessages();

#endif
