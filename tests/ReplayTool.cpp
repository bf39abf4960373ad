#include "tests/ReplayTool.h"

#include <cstdlib>
#include <fstream>
#include <sstream>

#include <sys/wait.h>

namespace {

std::string contents(const std::filesystem::path& file) {
    std::ostringstream text;
    text << std::ifstream(file).rdbuf();
    return text.str();
}

}  // namespace

ReplayToolTest::ReplayToolTest() {
    std::string name = ::testing::TempDir() + "replay-XXXXXX";
    mFolder = mkdtemp(name.data());
    std::filesystem::current_path(mFolder);
}

ReplayToolTest::~ReplayToolTest() {
    std::filesystem::remove_all(mFolder);
}

void ReplayToolTest::write(const std::string& name, const std::string& text) const {
    std::ofstream(mFolder / name, std::ios::binary) << text;
}

Played ReplayToolTest::run(const std::string& arguments, const std::string& input) const {
    write("in", input);
    const int status =
            std::system(("'" SENSOR_REPLAY "' " + arguments + " <in >out 2>err").c_str());
    return {WIFEXITED(status) ? WEXITSTATUS(status) : -1, contents(mFolder / "out"),
            contents(mFolder / "err")};
}

std::vector<std::string> ReplayToolTest::happened(const Played& played) {
    std::vector<std::string> lines;
    std::istringstream out(played.out);
    for (std::string line; std::getline(out, line);) {
        if (line.find(R"("boot": )") == std::string::npos) lines.push_back(line);
    }
    return lines;
}
