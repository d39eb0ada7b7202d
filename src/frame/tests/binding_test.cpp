#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cstdio>
#include <string>

#ifndef _WIN32
#include <sys/wait.h>
#endif

// Where the module finds its host; each case runs in a separate process.

namespace qx::test {
namespace {

#ifdef _WIN32
// The command interpreter takes a path with backslashes only.
std::string Path(std::string path) {
    std::replace(path.begin(), path.end(), '/', '\\');
    return path;
}
FILE *Open(const std::string &command) { return _popen(command.c_str(), "r"); }
int Close(FILE *pipe) { return _pclose(pipe); }
std::string Library(const std::string &name) { return Path(QX_HOST_FOLDER + name + ".dll"); }
#else
std::string Path(std::string path) { return path; }
FILE *Open(const std::string &command) { return popen(command.c_str(), "r"); }
int Close(FILE *pipe) { return WEXITSTATUS(pclose(pipe)); }
std::string Library(const std::string &name) { return QX_HOST_FOLDER "lib" + name + ".so"; }
#endif

struct Outcome {
    int exitCode;
    std::string text;
};

Outcome RunProbe(const std::string &program, const std::string &arguments = "") {
    FILE *pipe =
        Open(std::string(QX_RUNNER) + Path(QX_PROBE_FOLDER + program) + " " + arguments + " 2>&1");
    std::string text;
    std::array<char, 256> buffer;
    while (std::fgets(buffer.data(), buffer.size(), pipe) != nullptr)
        text += buffer.data();
    std::erase(text, '\r');
    return {Close(pipe), text};
}

TEST(Binding, SearchesFourPlacesInOrder) {
    const std::string runtime = Library("qxrt");
    const std::string second = Library("qxffrt");
    const std::string other = Library("other");
    const auto found = [](const Outcome &outcome) {
        EXPECT_EQ(outcome.exitCode, 0) << outcome.text;
        return outcome.text;
    };
    EXPECT_EQ(found(RunProbe("probe_plain", second)), "ffrt 1\n");
    EXPECT_EQ(found(RunProbe("probe_plain", second + " " + runtime)), "rt 1\n");
    EXPECT_EQ(found(RunProbe("probe_version", runtime + " " + second)), "main by version 1\n");
    EXPECT_EQ(found(RunProbe("probe_chunk", runtime)), "main by chunk 1\n");
    EXPECT_EQ(found(RunProbe("probe_version", runtime + " set " + other)), "other 1\n");
}

TEST(Binding, WithoutAHostTheProcessEnds) {
    const Outcome nowhere = RunProbe("probe_plain");
    EXPECT_EQ(nowhere.exitCode, 1);
    EXPECT_EQ(nowhere.text, "Fatal Error: dataloom.lib was not called from a Dataloom process.\n");

    // A host that lacks the function is not skipped in favour of one that has it.
    const std::string missing =
        "Fatal Error: dataloom.lib could not locate \"HostRegisterSweep\".\n";
    for (const std::string &arguments : {std::string(), Library("qxrt")}) {
        const Outcome partial = RunProbe("probe_partial", arguments);
        EXPECT_EQ(partial.exitCode, 1);
        EXPECT_EQ(partial.text, missing);
    }
}

} // namespace
} // namespace qx::test
