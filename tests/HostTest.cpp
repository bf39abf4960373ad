#include <cstdio>
#include <filesystem>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

namespace {

using ::testing::AllOf;
using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::Not;

/** A client at the socket of a host. */
class Client {
public:
    explicit Client(const std::string& path) : mSocket(socket(AF_UNIX, SOCK_STREAM, 0)) {
        sockaddr_un address{};
        address.sun_family = AF_UNIX;
        path.copy(address.sun_path, sizeof(address.sun_path) - 1);
        // If this fails, so does all that is said.
        static_cast<void>(connect(mSocket, reinterpret_cast<sockaddr*>(&address), sizeof(address)));
    }
    ~Client() { close(mSocket); }
    Client(const Client&) = delete;
    Client& operator=(const Client&) = delete;

    /** The host's answer to a line. */
    std::string say(const std::string& line) {
        const std::string text = line + '\n';
        send(mSocket, text.data(), text.size(), MSG_NOSIGNAL);
        return answer();
    }

    /** Says nothing more. Returns when the host has let go of the connection. */
    void leave() {
        shutdown(mSocket, SHUT_WR);
        EXPECT_EQ(answer(), "");
    }

private:
    std::string answer() {
        std::string text;
        for (char byte = 0; recv(mSocket, &byte, 1, 0) == 1 && byte != '\n';) text += byte;
        return text;
    }

    const int mSocket;
};

/** A host with short hours, which clients reach at `mPath`. */
class HostTest : public ::testing::Test {
protected:
    HostTest() {
        while (nextLine().find("listening") == std::string::npos && !std::feof(mOutput.get())) {}
    }
    ~HostTest() override {
        Client(mPath).say("stop");
        std::filesystem::remove(mPath);
    }

    /** The next line of the host's output and log; empty at its end. */
    std::string nextLine() {
        char line[4096] = {};
        return std::fgets(line, sizeof(line), mOutput.get()) == nullptr ? "" : line;
    }

    /** Stops the host and returns what it has reported: the payloads of the event `id`. */
    std::vector<std::string> reports(const std::string& id) {
        EXPECT_EQ(Client(mPath).say("stop"), "");
        std::vector<std::string> payloads;
        for (std::string line = nextLine(); !line.empty(); line = nextLine()) {
            const size_t at = line.find(id);
            if (at != std::string::npos) payloads.push_back(line.substr(at + id.size() + 1));
        }
        return payloads;
    }

    const std::string mPath = ::testing::TempDir() + "host-" + std::to_string(getpid());

private:
    const std::unique_ptr<std::FILE, int (*)(std::FILE*)> mOutput{
            popen(("'" SENSOR_HOST "' --hour-ms 1 --no-clock --socket '" + mPath + "' 2>&1")
                          .c_str(),
                  "r"),
            pclose};
};

TEST_F(HostTest, CleansUpAfterClientsThatGo) {
    Client stays(mPath);
    Client goes(mPath);
    EXPECT_EQ(stays.say("enable com.a com.a 11 20000000"), "ok");
    EXPECT_EQ(goes.say("enable com.b com.b 3 20000000"), "ok");
    goes.leave();
    EXPECT_EQ(stays.say("hours 23 23"), "ok");
    EXPECT_THAT(reports("N273|10012"),
                ElementsAre(AllOf(HasSubstr("com.b/com.b"), Not(HasSubstr("com.a")))));
}

TEST_F(HostTest, AnswersWhatIsWrongAndGoesOn) {
    const std::pair<const char*, const char*> lines[] = {
            {"", "ok"},
            {"# a comment", "ok"},
            {"fly", "unknown command: fly"},
            {"charge", "usage: charge STATE"},
            {"charge two", "usage: charge STATE"},
            {"charge 2 3", "usage: charge STATE"},
            {"charge 99999999999", "usage: charge STATE"},
            {"event 8 0 far", "usage: event TYPE NUMBER..."},
            {"event 1 1 2 3 4 5 6 7 8 9 10 11 12 13 14 15 16 17",
             "an event has at most 16 numbers"},
            {"disable com.a com.a 1", "has no connection: com.a com.a"},
            {"disconnect com.a com.a", "has no connection: com.a com.a"},
            {"change nothing", "unknown change: nothing"},
            {"set nothing 1", "unknown variable: nothing"},
            {"hours 23 24", "an hour is 0 to 23"},
            {"show 0 0 256", "a colour is three numbers from 0 to 255"},
            {"charge 2", "ok"},
    };
    Client client(mPath);
    for (const auto& [line, answer] : lines) EXPECT_EQ(client.say(line), answer) << line;
}

}  // namespace
