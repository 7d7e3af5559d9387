#include "RunRcvrchar.h"

#include <cstdlib>

namespace clitest {

CommandRun runRcvrchar(const testsupport::TempDir& dir, const std::string& arguments,
                       const std::string& input) {
    testsupport::writeFile(dir / "stdin.txt", input);
    const std::string command = "cd '" + dir.path().string() +
                                "' && '" RCVRCHAR_BINARY_DIR "/bin/rcvrchar' " + arguments +
                                " <stdin.txt >out.txt 2>err.txt";
    const int raw = std::system(command.c_str());
    return {WIFEXITED(raw) ? WEXITSTATUS(raw) : -1, testsupport::readFile(dir / "out.txt"),
            testsupport::readFile(dir / "err.txt")};
}

std::string quotedSample() {
    return "'" + testsupport::sampleConfiguration().string() + "'";
}

}  // namespace clitest
