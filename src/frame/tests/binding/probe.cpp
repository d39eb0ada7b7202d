#include "frame/tests/binding/system.h"
#include "qx/frame.h"

#include <cstdio>
#include <cstring>

// Loads the named libraries, passes the one after "set" to SetQXRTModule, and reserves the
// workspace, for which the host must register a sweep. A fatal message is written to standard error
// as "caption: text".
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
