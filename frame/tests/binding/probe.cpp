#include "qx/frame.h"

#include <dlfcn.h>

#include <cstdio>
#include <cstring>

// Loads the libraries that are named, hands the one behind "set" to SetQXRTModule, and reserves
// the workspace, which asks the host to register a sweep.
int main(int argc, char **argv) {
    for (int i = 1; i < argc; ++i) {
        const bool set = std::strcmp(argv[i], "set") == 0;
        void *module = dlopen(argv[set ? ++i : i], RTLD_NOW);
        if (module == nullptr) {
            std::fprintf(stderr, "%s\n", dlerror());
            return 3;
        }
        if (set && SetQXRTModule(module, 0) != module)
            return 4;
    }
    WorkspaceStatus status = {0, 1};
    InitializeAnalysisWorkspaceH(100, &status);
    return status.code == 0 ? 0 : 2;
}
