#include "base/DiagnosticLog.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <algorithm>
#include <fstream>
#include <sstream>

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

    void addLines(int count, bool numbered = true) {
        for (int i = 0; i < count; ++i)
            m_log.addLine("x\n", numbered);
    }

    std::filesystem::path path() { return m_machine->folder() / "Public" / "log.txt"; }
    bool exists() { return std::filesystem::exists(path()); }

    std::string content() {
        const std::ifstream file(path(), std::ios::binary);
        std::ostringstream content;
        content << file.rdbuf();
        return content.str();
    }

    std::ptrdiff_t lineCount() {
        const std::string text = content();
        return std::count(text.begin(), text.end(), '\n');
    }

    void failToOpen(int times) {
        m_machine.ask(
            "{'do':'fail','call':'open','error':5,'match':'log.txt','times':" + std::to_string(times) + "}");
    }

    simulation::TestMachine m_machine;
    DiagnosticLog m_log;
};

TEST_F(LogFile, TakesNothingBeforeItsThreadExists) {
    addLines(3);
    m_log.flushToFile();
    EXPECT_FALSE(exists());
    start();
    m_log.addLine("first\n", true);
    m_log.flushToFile();
    EXPECT_EQ(content(), "[1] first\n");
}

TEST_F(LogFile, NumbersWhatIsToBeNumberedAndIgnoresEmptyText) {
    start();
    m_log.addLine("a", true);
    m_log.addLine("", true);
    m_log.addLine(" b", false);
    m_log.addLine("c\n", true);
    m_log.flushToFile();
    m_log.addLine("d\n", true);
    m_log.flushToFile();
    EXPECT_EQ(content(), "[1] a b[2] c\n[3] d\n");
}

TEST_F(LogFile, IsReadableByItsOwnerOnly) {
    start();
    m_log.flushToFile();
    struct stat status {};
    ASSERT_EQ(::stat(path().c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 07777, 0600U);
}

TEST_F(LogFile, ThousandthAndFirstLineWaitsAndTheNextWritesThemOut) {
    start();
    addLines(1001);
    EXPECT_FALSE(exists());
    addLines(1);
    EXPECT_EQ(lineCount(), 1001);
    m_log.flushToFile();
    EXPECT_TRUE(content().ends_with("[1001] x\n[1002] x\n"));
}

TEST_F(LogFile, IsWrittenEveryTenSecondsAlsoWhenThereIsNothing) {
    start();
    m_machine.advance(9900);
    EXPECT_FALSE(exists());
    m_machine.advance(200);
    EXPECT_TRUE(exists());
    EXPECT_EQ(content(), "");
    addLines(2);
    m_machine.advance(9800);
    EXPECT_EQ(lineCount(), 0);
    m_machine.advance(200);
    EXPECT_EQ(lineCount(), 2);
}

TEST_F(LogFile, LosesAtAStopWhatIsNotWritten) {
    start();
    addLines(5);
    m_log.flushToFile();
    addLines(5);
    m_log.stop();
    addLines(5);
    m_log.flushToFile();
    EXPECT_EQ(lineCount(), 5);
}

TEST_F(LogFile, KeepsItsLinesWhileTheFileCannotBeOpened) {
    start();
    addLines(3);
    failToOpen(2);
    m_log.flushToFile();
    m_log.flushToFile();
    EXPECT_FALSE(exists());
    addLines(1);
    m_log.flushToFile();
    EXPECT_EQ(content(), "[1] x\n[2] x\n[3] x\n[4] x\n");
    m_log.flushToFile();
    EXPECT_EQ(lineCount(), 4);
}

TEST_F(LogFile, KeepsTheLastHundredThousandAtMost) {
    start();
    failToOpen(1000000);
    addLines(100010);
    EXPECT_FALSE(exists());
    while (m_machine->faults().nextError("open", "log.txt"))
        continue;
    m_log.flushToFile();
    EXPECT_TRUE(content().starts_with("[11] x\n[12] x\n"));
    EXPECT_TRUE(content().ends_with("[100010] x\n"));
}

TEST_F(LogFile, WithoutAPathIsLikeOneThatCannotBeOpened) {
    m_log.start("");
    addLines(1200);
    m_log.flushToFile();
    m_machine.advance(10000);
    EXPECT_FALSE(exists());
}

TEST_F(LogFile, CountsToAMillionAndBeginsAgain) {
    start();
    addLines(1000001);
    m_log.flushToFile();
    EXPECT_TRUE(content().ends_with("[999999] x\n[1000000] x\n[1] x\n"));
}

}  // namespace
}  // namespace vexa::test
