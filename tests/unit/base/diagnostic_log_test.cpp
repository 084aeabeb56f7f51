#include "base/DiagnosticLog.h"

#include <gtest/gtest.h>

#include <fstream>
#include <iterator>

#include "platform/KnownFolders.h"
#include "text/TextConversion.h"
#include "unit/simulation/TestMachine.h"

namespace vexa::test {
namespace {

/// A log of its own on a machine whose clock stands still.
class LogFile : public testing::Test {
protected:
    LogFile() { std::filesystem::create_directories(m_machine->folder() / "Public"); }
    ~LogFile() override { m_log.stop(); }

    void start() { m_log.start(narrowFromWide(*platform::publicFolder()) + "\\log.txt"); }

    void addLines(int count) {
        for (int i = 0; i < count; ++i)
            m_log.addLine("x\n", true);
    }

    std::string content() {
        std::ifstream file(m_machine->folder() / "Public" / "log.txt", std::ios::binary);
        if (!file) return "no file";
        return {std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()};
    }

    std::string flushed() {
        m_log.flushToFile();
        return content();
    }

    void failToOpen(int times) {
        m_machine.ask(
            "{'do':'fail','call':'open','error':5,'match':'log.txt','times':" + std::to_string(times) + "}");
    }

    simulation::TestMachine m_machine;
    DiagnosticLog m_log;
};

TEST_F(LogFile, TakesItsLinesBetweenItsStartAndItsStopAndLosesThenWhatIsNotWritten) {
    addLines(3);
    EXPECT_EQ(flushed(), "no file");
    start();
    m_log.addLine("a", true);
    m_log.addLine("", true);
    m_log.addLine(" b", false);
    m_log.addLine("c\n", true);
    EXPECT_EQ(flushed(), "[1] a b[2] c\n");
    addLines(1);
    EXPECT_EQ(flushed(), "[1] a b[2] c\n[3] x\n");
    addLines(5);
    m_log.stop();
    addLines(5);
    EXPECT_EQ(flushed(), "[1] a b[2] c\n[3] x\n");
}

TEST_F(LogFile, ThousandthAndFirstLineWaitsAndTheNextWritesThemOut) {
    start();
    addLines(1001);
    EXPECT_EQ(content(), "no file");
    addLines(1);
    EXPECT_TRUE(content().ends_with("[1001] x\n"));
    EXPECT_TRUE(flushed().ends_with("[1001] x\n[1002] x\n"));
}

TEST_F(LogFile, KeepsItsLinesWhileTheFileCannotBeOpened) {
    start();
    addLines(1);
    failToOpen(2);
    m_log.flushToFile();
    EXPECT_EQ(flushed(), "no file");
    addLines(1);
    EXPECT_EQ(flushed(), "[1] x\n[2] x\n");
    EXPECT_EQ(flushed(), "[1] x\n[2] x\n");
}

TEST_F(LogFile, KeepsTheLastHundredThousandAtMost) {
    start();
    failToOpen(1000000);
    addLines(100010);
    while (m_machine->faults().nextError("open", "log.txt"))
        continue;
    EXPECT_NE(flushed().find("  10 lines of the log were lost.\n[11] x\n[12] x\n"), std::string::npos);
    EXPECT_TRUE(content().ends_with("[100010] x\n"));
}

TEST_F(LogFile, KeepsTheLastMebibyteThatAFullDiskDidNotTake) {
    start();
    addLines(1);
    EXPECT_EQ(flushed(), "[1] x\n");
    m_machine.ask("{'do':'fail','call':'write','error':112,'match':'log.txt','times':3}");
    addLines(1);
    EXPECT_EQ(flushed(), "[1] x\n");
    const std::string half(1 << 19, 'h');
    for (int i = 0; i < 3; ++i)
        m_log.addLine(half, false);
    EXPECT_EQ(flushed(), "[1] x\n");
    EXPECT_EQ(flushed(), "[1] x\n");
    EXPECT_EQ(flushed().substr(flushed().find("  2 lines")),
              "  2 lines of the log were lost.\n" + half + half);
}

TEST_F(LogFile, WithoutAPathIsLikeOneThatCannotBeOpened) {
    m_log.start("");
    addLines(1200);
    m_machine.advance(10000);
    EXPECT_EQ(content(), "no file");
}

TEST_F(LogFile, CountsToAMillionAndBeginsAgain) {
    start();
    addLines(1000001);
    EXPECT_TRUE(flushed().ends_with("[999999] x\n[1000000] x\n[1] x\n"));
}

}  // namespace
}  // namespace vexa::test
