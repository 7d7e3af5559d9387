#include <gtest/gtest.h>
#include <unistd.h>

#include "ErrorOf.h"
#include "TempDir.h"
#include "platform/FolderLock.h"
#include "platform/Sha256.h"
#include "platform/WholeFile.h"

using platform::WholeFile;
using testsupport::errorOf;
using testsupport::readFile;
using testsupport::writeFile;

TEST(Sha256, KnownDigestsWhateverTheChunking) {
    EXPECT_EQ(platform::sha256Hex(""),
              "e3b0c44298fc1c149afbf4c8996fb92427ae41e4649b934ca495991b7852b855");
    EXPECT_EQ(platform::sha256Hex("abc"),
              "ba7816bf8f01cfea414140de5dae2223b00361a396177a9cb410ff61f20015ad");
    // 56 bytes: the length no longer fits the first padding block.
    EXPECT_EQ(platform::sha256Hex("abcdbcdecdefdefgefghfghighijhijkijkljklmklmnlmnomnopnopq"),
              "248d6a61d20638b8e5c026930c3e6039a33ce45964ff2167f6ecedd419db06c1");
    platform::Sha256 million;
    const std::string chunk(997, 'a');
    std::size_t fed = 0;
    for (std::size_t size = 1; fed < 1000000; size = size % 900 + 13) {
        const std::size_t take = std::min(size, 1000000 - fed);
        million.update(std::string_view(chunk).substr(0, take));
        fed += take;
    }
    EXPECT_EQ(million.hexDigest(),
              "cdc76e5c9914fb9281a1c7e284d73e67f1809a48a497200e046d39ccc7112cd0");
}

TEST(WholeFile, ReplacesOnlyOnCommitAndAFailureLeavesTheEarlierFile) {
    testsupport::TempDir dir;
    const auto target = dir / "out.txt";
    writeFile(target, "earlier");
    {
        WholeFile file(target, "the test file out.txt");
        file.write("half");
        // Dropped without commit: as if the writer failed in the middle.
    }
    EXPECT_EQ(readFile(target), "earlier");
    EXPECT_FALSE(std::filesystem::exists(WholeFile::partialPath(target)));

    platform::writeWholeFile(target, "new", "the test file out.txt");
    EXPECT_EQ(readFile(target), "new");

    // A directory where the partial file should go: nothing can be written.
    std::filesystem::create_directory(WholeFile::partialPath(target));
    EXPECT_EQ(errorOf([&] { platform::writeWholeFile(target, "lost", "the test file out.txt"); }),
              "Cannot write the test file out.txt (" + target.string() +
                  "): Is a directory; any earlier file of that name is left as it was");
    EXPECT_EQ(readFile(target), "new");

    // A parent that is a regular file.
    const auto under = dir / "out.txt" / "x.txt";
    EXPECT_NE(
        errorOf([&] { platform::writeWholeFile(under, "x", "x.txt"); }).find("Not a directory"),
        std::string::npos);
}

TEST(FolderLock, ASecondHolderIsRefusedUntilTheFirstIsGone) {
    testsupport::TempDir dir;
    // A lock file left by a process that died holds no lock.
    writeFile(dir / platform::FolderLock::kFileName, "the dialog, process 999999\n");
    {
        platform::FolderLock first(dir.path(), "the dialog");
        EXPECT_EQ(readFile(dir / platform::FolderLock::kFileName),
                  "the dialog, process " + std::to_string(::getpid()) + "\n");
        EXPECT_EQ(errorOf([&] { platform::FolderLock second(dir.path(), "export"); }),
                  "The folder " + dir.path().string() +
                      " is in use by another rcvrchar (the dialog, process " +
                      std::to_string(::getpid()) +
                      "); wait until it has ended, or use another folder");
    }
    // Released, the note is gone and the next holder is let in.
    EXPECT_EQ(readFile(dir / platform::FolderLock::kFileName), "");
    EXPECT_EQ(errorOf([&] { platform::FolderLock again(dir.path(), "export"); }), "nothing thrown");
    writeFile(dir / "file", "x");
    EXPECT_NE(errorOf([&] {
                  platform::FolderLock bad(dir / "file" / "sub", "export");
              }).find("Cannot lock the folder"),
              std::string::npos);
}
