#include "tests/compare/trampolines.h"

#include <dlfcn.h>

namespace qx::test {

void *BindExports(const char *module) {
    void *loaded = dlopen(module, RTLD_NOW | RTLD_LOCAL);
    if (loaded == nullptr)
        return nullptr;
    for (std::size_t i = 0; i < ExportNames().size(); ++i)
        qxExportTargets[i] = dlsym(loaded, ExportNames()[i]);
    return loaded;
}

} // namespace qx::test
