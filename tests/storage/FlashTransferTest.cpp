#include <gtest/gtest.h>
#include <sys/resource.h>

#include <csignal>
#include <functional>

#include "ErrorOf.h"
#include "SimBench.h"
#include "platform/ErrorText.h"
#include "storage/FlashTransfer.h"
#include "storage/PortDataFile.h"

using storage::RcvrCharImage;
using storagetest::SimBench;

namespace {

using testsupport::errorOf;

const std::string kConfigurations = "C:\\ProgramData\\Velquor\\Network Analyzer\\Configurations\\";

RcvrCharImage imageOf(const std::string& receiver, std::uint32_t records) {
    auto image = RcvrCharImage::withHeader(receiver, records, -2.5f, 30.0f);
    for (std::uint32_t i = 0; i < records; ++i) {
        image.appendRecord(
            1e9 * (i + 1),
            {{{-10, -0.05f, -0.1f}, {-9, -0.1f, -0.2f}, {-8, -0.2f, -0.4f}, {-7, -0.5f, -1.0f}}});
    }
    return image;
}

std::string dataFile(int port, const char* file) {
    return kConfigurations + "T3951A Broadband\\Port " + std::to_string(port) +
           "\\Factory Cal Data\\" + file;
}

// A refused push names the file and the reason, leaves no partial file and pushes nothing.
void expectRefused(SimBench& bench, const std::string& text, const std::string& path,
                   const std::string& reason) {
    EXPECT_EQ(text, "Cannot write the characterization data file " + path + " (" +
                        bench.local(path).string() + "): " + reason +
                        "; any earlier file of that name is left as it was");
    EXPECT_FALSE(std::filesystem::exists(bench.local(path + ".partial")));
    EXPECT_TRUE(bench.commands().empty());
}

// Limits the size of files this process may write, as a full disk would, for one scope.
class FileSizeLimit {
  public:
    explicit FileSizeLimit(rlim_t bytes) {
        m_oldHandler = std::signal(SIGXFSZ, SIG_IGN);
        getrlimit(RLIMIT_FSIZE, &m_old);
        rlimit limit = m_old;
        limit.rlim_cur = bytes;
        setrlimit(RLIMIT_FSIZE, &limit);
    }
    ~FileSizeLimit() {
        setrlimit(RLIMIT_FSIZE, &m_old);
        std::signal(SIGXFSZ, m_oldHandler);
    }

  private:
    rlimit m_old{};
    void (*m_oldHandler)(int);
};

}  // namespace

TEST(PortDataFile, PathFollowsModelReceiverKindAndPort) {
    struct Case {
        const char* receiver;
        char port;
        const char* file;
    };
    for (const Case& c :
         {Case{"A", '1', "RcvrCharTest.dat"}, Case{"B", '2', "RcvrCharTest.dat"},
          Case{"C", '3', "RcvrCharTest.dat"}, Case{"D", '4', "RcvrCharTest.dat"},
          Case{"R1", '1', "RcvrCharRef.dat"}, Case{"R3", '3', "RcvrCharRef.dat"},
          Case{"R4", '4', "RcvrCharRef.dat"}, Case{"R2_LFE", '2', "RcvrCharRef.dat"},
          Case{"R1 LOW FREQUENCY EXTENSION", '1', "RcvrCharRef.dat"}}) {
        auto file = storage::portDataFile("T3951A", c.receiver);
        EXPECT_EQ(file.portDigit, c.port) << c.receiver;
        EXPECT_EQ(file.fileName, c.file) << c.receiver;
        EXPECT_EQ(file.path, kConfigurations + "T3951A Broadband\\Port " + c.port +
                                 "\\Factory Cal Data\\" + c.file)
            << c.receiver;
    }
}

TEST(PortDataFile, NamesWithoutAPortAreRefused) {
    for (const char* name : {"", "E", "AB", "R", "R9", "RX"}) {
        EXPECT_FALSE(storage::findPortDataFile("T3951A", name)) << name;
    }
    EXPECT_EQ(errorOf([] { storage::portDataFile("T3951A", "E"); }),
              "Receiver \"E\" has no port data file: it is neither a reference receiver R1 to R4 "
              "nor a test receiver A to D");
}

TEST(PushPortFile, WritesTheImageAndPushesItsPort) {
    SimBench bench(storagetest::kMillimetreWave);
    auto path = dataFile(2, "RcvrCharTest.dat");
    testsupport::writeFile(bench.local(path), std::string(9000, 'x'));  // replaced whole
    auto image = imageOf("B", 3);
    auto waitedBefore = bench.clock.totalWaited();

    storage::pushPortFile(bench.context(), "B", image);

    EXPECT_EQ(testsupport::readFile(bench.local(path)), image.bytes());
    EXPECT_FALSE(std::filesystem::exists(bench.local(path + ".partial")));
    EXPECT_EQ(bench.commands(), std::vector<std::string>{"diag:mm:data:push 2,0"});
    EXPECT_EQ(bench.logLines(),
              (std::vector<std::string>{"Initialized file", "diag:mm:data:push 2,0"}));
    EXPECT_TRUE(bench.ui.boxes().empty());
    EXPECT_EQ(bench.clock.totalWaited() - waitedBefore, std::chrono::milliseconds(2000 + 50 * 2));
}

TEST(PushPortFile, TwoAnalyzerErrorsShowInOneBoxAndInTheLog) {
    SimBench bench(std::string(storagetest::kMillimetreWave) + R"(, "faults": {"scpi_errors": [
        {"command": "diag:mm:data:push", "errors": ["-200,\"Execution error\"",
                                                    "-222,\"Data out of range\""]}]})");
    bench.ui.answer("SCPI Error Writing Flash", {platform::Answer::Ok});
    storage::pushPortFile(bench.context(), "A", imageOf("A", 2));
    auto boxes = bench.ui.boxes();
    ASSERT_EQ(boxes.size(), 1u);
    EXPECT_EQ(boxes[0].box.text, ",\"Execution error\"\n,\"Data out of range\"");
    EXPECT_EQ(boxes[0].box.buttons, platform::Buttons::Ok);
    EXPECT_EQ(boxes[0].box.flags, platform::BoxSystemModal);
    EXPECT_EQ(bench.logLines(),
              (std::vector<std::string>{"Initialized file", "diag:mm:data:push 1,0",
                                        ",\"Execution error\"", ",\"Data out of range\""}));
}

TEST(PushPortFile, MissingFolderRaisesAndSendsNoPush) {
    SimBench bench(storagetest::kMillimetreWave);
    auto path = dataFile(4, "RcvrCharTest.dat");
    std::filesystem::remove_all(bench.local(path).parent_path());
    auto text = errorOf([&] { storage::pushPortFile(bench.context(), "D", imageOf("D", 1)); });
    expectRefused(bench, text, path, "No such file or directory");
    EXPECT_EQ(bench.logLines(), std::vector<std::string>{"Initialized file"});
}

TEST(PushPortFile, FullDiskKeepsTheOldFileWholeAndSendsNoPush) {
    SimBench bench(storagetest::kMillimetreWave);
    auto path = dataFile(1, "RcvrCharRef.dat");
    auto old = imageOf("R1", 1).bytes();
    testsupport::writeFile(bench.local(path), old);
    std::string text;
    {
        FileSizeLimit limit(200);
        text = errorOf([&] { storage::pushPortFile(bench.context(), "R1", imageOf("R1", 10)); });
    }
    expectRefused(bench, text, path, "File too large");
    EXPECT_EQ(testsupport::readFile(bench.local(path)), old);
}

TEST(PushPortFile, TargetThatCannotBeReplacedRaisesWithTheReason) {
    SimBench bench(storagetest::kMillimetreWave);
    auto path = dataFile(2, "RcvrCharRef.dat");
    std::filesystem::create_directories(bench.local(path) / "occupied");
    auto text = errorOf([&] { storage::pushPortFile(bench.context(), "R2", imageOf("R2", 1)); });
    expectRefused(bench, text, path, "Is a directory");
}

TEST(ReloadFromFlash, SendsLoadAndPushAndLogsBoth) {
    SimBench bench;
    auto waitedBefore = bench.clock.totalWaited();
    bool needsPreparation = false;
    EXPECT_TRUE(storage::reloadFromFlash(bench.context(), needsPreparation));
    EXPECT_TRUE(needsPreparation);
    EXPECT_EQ(bench.commands(),
              (std::vector<std::string>{"diag:fcal:load", "diag:mm:data:push 1,0"}));
    EXPECT_EQ(bench.logLines(),
              (std::vector<std::string>{"Initialized file", "diag:fcal:load",
                                        "After diag fcal load  ", "diag:mm:data:push 1,0"}));
    EXPECT_TRUE(bench.ui.boxes().empty());
    EXPECT_EQ(bench.clock.totalWaited() - waitedBefore, std::chrono::milliseconds(1000 + 50 * 4));
}

TEST(ReloadFromFlash, ErrorsOfEachStepGetTheirOwnCaptionAndTheFlagIsStillSet) {
    SimBench bench(std::string(storagetest::kMillimetreWave) + R"(, "faults": {"scpi_errors": [
        {"command": "diag:fcal:load", "errors": ["-100,\"Command error\""]},
        {"command": "diag:mm:data:push", "errors": ["-200,\"Execution error\""]}]})");
    bench.ui.answerAll(platform::Answer::Ok);
    bool needsPreparation = false;
    EXPECT_TRUE(storage::reloadFromFlash(bench.context(), needsPreparation));
    EXPECT_TRUE(needsPreparation);
    EXPECT_EQ(bench.ui.captions(), (std::vector<std::string>{"SCPI Error loading from flash",
                                                             "SCPI Error Writing Flash"}));
    EXPECT_EQ(bench.logLines(),
              (std::vector<std::string>{"Initialized file", "diag:fcal:load", ",\"Command error\"",
                                        "After diag fcal load  ", "diag:mm:data:push 1,0",
                                        ",\"Execution error\""}));
}

TEST(FlashCommandLog, CreateStartsAfreshAndFailsLoudlyWithoutAFolder) {
    testsupport::TempDir dir;
    platform::DrivePathMap paths(dir.path());
    storage::FlashCommandLog log(paths);
    testsupport::writeFile(dir / "FlashCommands.txt", "stale\r\n");
    log.create();
    log.append("one\ntwo");
    EXPECT_EQ(testsupport::readFile(dir / "FlashCommands.txt"),
              "Initialized file\r\none\r\ntwo\r\n");

    platform::DrivePathMap missing(dir / "absent");
    storage::FlashCommandLog nowhere(missing);
    EXPECT_EQ(errorOf([&] { nowhere.create(); }),
              "Cannot create the flash command log .\\FlashCommands.txt (" +
                  (dir / "absent" / "FlashCommands.txt").string() + "): No such file or directory");
    EXPECT_NO_THROW(nowhere.append("lost"));
}
