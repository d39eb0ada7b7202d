#include <gtest/gtest.h>

#include <array>
#include <cstdio>
#include <string>
#include <sys/wait.h>

// Where the module finds its host: each case in a process of its own.

namespace {

const std::string folder = QX_BINDING_FOLDER;

struct Outcome {
    int exitCode;
    std::string text;
};

Outcome RunProbe(const std::string &program, const std::string &arguments = "") {
    FILE *pipe = popen((folder + "/" + program + " " + arguments + " 2>&1").c_str(), "r");
    std::string text;
    std::array<char, 256> buffer;
    while (std::fgets(buffer.data(), buffer.size(), pipe) != nullptr)
        text += buffer.data();
    return {WEXITSTATUS(pclose(pipe)), text};
}

std::string Library(const std::string &name) { return folder + "/hosts/" + name; }

TEST(Binding, SearchesFourPlacesInOrder) {
    const std::string runtime = Library("libqxrt.so");
    const std::string second = Library("libqxffrt.so");
    const std::string other = Library("libother.so");
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

    // A host that lacks the function is not passed over for one that has it.
    const std::string missing =
        "Fatal Error: dataloom.lib could not locate \"HostRegisterSweep\".\n";
    for (const std::string &arguments : {std::string(), Library("libqxrt.so")}) {
        const Outcome partial = RunProbe("probe_partial", arguments);
        EXPECT_EQ(partial.exitCode, 1);
        EXPECT_EQ(partial.text, missing);
    }
}

} // namespace
