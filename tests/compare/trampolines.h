#ifndef QX_TESTS_COMPARE_TRAMPOLINES_H
#define QX_TESTS_COMPARE_TRAMPOLINES_H

#include <vector>

// Where each export is, in the order of their names; a function for each jumps there
// (make_trampolines.py).
extern "C" __attribute__((visibility("hidden"))) void *qxExportTargets[];

namespace qx::test {

const std::vector<const char *> &ExportNames();
// Loads a module and takes its exports; returns its handle, or null. An export that the module does
// not have must not be called.
void *BindExports(const char *module);

} // namespace qx::test

#endif
