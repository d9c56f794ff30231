#include <cstdio>
#include <cstdlib>
#include <gtest/gtest.h>
#include <sstream>
#include <sys/wait.h>

#include "devSeqSMDescription.h"

namespace Orv {

namespace {

/// What the program makes of the graph; its complaints are in it too.
std::pair<int, std::string> drawWithDot(const std::string& graph) {
    const std::string file = testing::TempDir() + "orvStateMachine" +
                             testing::UnitTest::GetInstance()->current_test_info()->name() + ".dot";
    std::FILE* const out = std::fopen(file.c_str(), "w");
    EXPECT_NE(out, nullptr);
    EXPECT_EQ(std::fwrite(graph.data(), 1, graph.size(), out), graph.size());
    EXPECT_EQ(std::fclose(out), 0);
    std::FILE* const pipe = popen(("dot -Tsvg '" + file + "' 2>&1").c_str(), "r");
    std::string text;
    for (int character = 0; (character = std::fgetc(pipe)) != EOF;)
        text += static_cast<char>(character);
    const int status = pclose(pipe);
    std::remove(file.c_str());
    return {WEXITSTATUS(status), text};
}

bool isDotInstalled() {
    return std::system("command -v dot >/dev/null 2>&1") == 0;
}

std::string graphOf(const DevSMTable& table, DevSMTable::Detail detail) {
    std::ostringstream stream;
    table.toDot(stream, detail);
    return stream.str();
}

TEST(DevSMTableDot, isReadByGraphviz) {
    if (!isDotInstalled()) GTEST_SKIP() << "Graphviz is not installed";
    const RCShdPtr<DevSMTable> table = makeDevSeqSMDescription().build();
    for (const auto detail : {DevSMTable::Detail::PRIMARY, DevSMTable::Detail::EXPANDED}) {
        const auto [status, text] = drawWithDot(graphOf(*table, detail));
        EXPECT_EQ(status, 0) << text;
        EXPECT_NE(text.find("<svg"), std::string::npos);
        for (const char* const state : {"init", "recover", "final"}) {
            EXPECT_NE(text.find(std::string(">") + state + "</text>"), std::string::npos) << state;
        }
        EXPECT_EQ(text.find("Warning"), std::string::npos) << text;
    }
}

TEST(DevSMTableDot, survivesNamesThatMeanSomethingToGraphviz) {
    if (!isDotInstalled()) GTEST_SKIP() << "Graphviz is not installed";
    DevSMDescription machine;
    machine.states = {"say \"hi\"", "back\\slash\\N", "-> [", ""};
    machine.events = {"e\\"};
    machine.transitions = {"\"];}"};
    machine.pairs = {{machine.states[0], machine.events[0], {machine.transitions[0]}}};
    machine.nextStates = {{machine.states[0], machine.transitions[0], machine.states[1]}};
    const auto [status, text] =
        drawWithDot(graphOf(*machine.build(), DevSMTable::Detail::EXPANDED));
    EXPECT_EQ(status, 0) << text;
    EXPECT_NE(text.find("say &quot;hi&quot;<"), std::string::npos) << text;
    EXPECT_NE(text.find("back\\slash\\N<"), std::string::npos) << text;
    EXPECT_NE(text.find("&#45;&gt; [<"), std::string::npos) << text;
    EXPECT_NE(text.find("e\\ / &quot;];}<"), std::string::npos) << text;
}

}  // namespace

}  // namespace Orv
