#include "tests/ReplayTool.h"

#include <cstdlib>
#include <fstream>
#include <sstream>

#include <sys/wait.h>

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

void ReplayToolTest::writeCapture(const std::string& name) const {
    std::ifstream example(EXAMPLES "/registrations.capture.txt");
    std::string text;
    for (std::string line; std::getline(example, line);) {
        if (line[0] != '#') text += line + '\n';
    }
    write(name, text);
}

std::string ReplayToolTest::read(const std::string& name) const {
    std::ostringstream text;
    text << std::ifstream(mFolder / name).rdbuf();
    return text.str();
}

Played ReplayToolTest::run(const std::string& arguments, const std::string& input,
                           const std::string& environment) const {
    write("in", input);
    const std::string command =
            "env " + environment + " '" SENSOR_REPLAY "' " + arguments + " <in >out 2>err";
    const int status = std::system(command.c_str());
    return {WIFEXITED(status) ? WEXITSTATUS(status) : -1, read("out"), read("err")};
}

std::vector<std::string> ReplayToolTest::happened(const Played& played) {
    std::vector<std::string> lines;
    std::istringstream out(played.out);
    for (std::string line; std::getline(out, line);) {
        if (line.find(R"("boot": )") == std::string::npos) lines.push_back(line);
    }
    return lines;
}
