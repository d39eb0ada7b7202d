#ifndef QX_TESTS_COMPARE_TRAMPOLINES_H
#define QX_TESTS_COMPARE_TRAMPOLINES_H

#include <vector>

// The address of each export, in the order of the names; a generated function per export jumps
// there (make_trampolines.py).
extern "C" __attribute__((visibility("hidden"))) void *qxExportTargets[];

namespace qx::test {

const std::vector<const char *> &ExportNames();
// Loads a module and binds its exports; returns its handle, or null. An export that the module
// lacks must not be called.
void *BindExports(const char *module);

} // namespace qx::test

#endif
