#include "frame/tests/binding/system.h"
#include "qx/frame.h"

#include <cstdio>
#include <cstring>

// Loads the libraries that are named, hands the one behind "set" to SetQXRTModule, and reserves
// the workspace, which asks the host to register a sweep. A fatal message goes to the standard
// error as "caption: text".
int main(int argc, char **argv) {
    PrintFatalMessages();
    for (int i = 1; i < argc; ++i) {
        const bool set = std::strcmp(argv[i], "set") == 0;
        void *module = LoadModule(argv[set ? ++i : i]);
        if (module == nullptr) {
            std::fprintf(stderr, "%s cannot be loaded\n", argv[i]);
            return 3;
        }
        if (set && SetQXRTModule(module, 0) != module)
            return 4;
    }
    WorkspaceStatus status = {0, 1};
    InitializeAnalysisWorkspaceH(100, &status);
    return status.code == 0 ? 0 : 2;
}
