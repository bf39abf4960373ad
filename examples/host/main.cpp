/** The service as a process: reads its commands from a script, and from clients at a socket. */

#include <cerrno>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <fstream>
#include <iostream>
#include <string>
#include <thread>

#include <CLI/CLI.hpp>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

#include "examples/host/SensorService.h"
#include "examples/host/Session.h"
#include "platform/PropertyService.h"

namespace host {
namespace {

using std::chrono::milliseconds;

enum : int { kStatusFailed = 1, kStatusBadInput = 2 };

struct Options {
    std::string script;
    std::string socket;
    std::string properties;
    int hourMs = 3'600'000;
    bool noClock = false;
};

int fail(int status, const std::string& what) {
    std::cerr << what << std::endl;
    return status;
}

/** Ends the process at once: the library's worker and the service's threads are still running. */
[[noreturn]] void end(SensorService* service, int status) {
    service->settle();
    if (const auto error = platform::propertyFileError()) status = fail(kStatusFailed, *error);
    if (std::fflush(stdout) != 0) status = fail(kStatusFailed, "cannot write the output");
    _exit(status);
}

int runScript(const std::string& file, Session* session) {
    std::ifstream script(file);
    if (!script) return fail(kStatusBadInput, file + ": " + std::strerror(errno));
    std::string line;
    for (int number = 1; !session->isOver() && std::getline(script, line); ++number) {
        if (const auto error = session->run(line)) {
            return fail(kStatusBadInput, file + ':' + std::to_string(number) + ": " + *error);
        }
    }
    return script.bad() ? fail(kStatusBadInput, file + ": cannot be read") : 0;
}

/** Answers each line with "ok" or with what is wrong. Device: binder takes the place of this. */
void serve(int client, SensorService* service, milliseconds hour) {
    std::FILE* const in = fdopen(client, "re");
    {
        Session session(service, hour);
        char* line = nullptr;
        size_t size = 0;
        while (getline(&line, &size, in) >= 0) {
            const std::string answer = session.run(line).value_or("ok") + '\n';
            if (session.isOver()) end(service, 0);
            if (send(client, answer.data(), answer.size(), MSG_NOSIGNAL) < 0) break;
        }
        std::free(line);
    }
    // The client sees the end of its connection when its sensors are cleaned up.
    std::fclose(in);
}

/** Returns the socket that listens at `path`, or -1. A socket that is left there is replaced. */
int listenAt(const std::string& path) {
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    if (path.size() >= sizeof(address.sun_path)) {
        errno = ENAMETOOLONG;
        return -1;
    }
    path.copy(address.sun_path, path.size());
    struct stat left {};
    if (lstat(path.c_str(), &left) == 0 && S_ISSOCK(left.st_mode)) unlink(path.c_str());
    const int listener = socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0);
    if (listener < 0 ||
        bind(listener, reinterpret_cast<const sockaddr*>(&address), sizeof(address)) != 0 ||
        listen(listener, SOMAXCONN) != 0) {
        return -1;
    }
    return listener;
}

void acceptClients(int listener, SensorService* service, milliseconds hour) {
    for (;;) {
        const int client = accept4(listener, nullptr, nullptr, SOCK_CLOEXEC);
        if (client >= 0) std::thread(serve, client, service, hour).detach();
    }
}

/** From the present hour on. */
[[noreturn]] void runClock(SensorService* service, milliseconds length) {
    const std::time_t now = std::time(nullptr);
    for (int hour = std::localtime(&now)->tm_hour;; hour = (hour + 1) % 24) {
        service->passHour(hour, length);
    }
}

int run(const Options& options) {
    std::setvbuf(stdout, nullptr, _IOLBF, 0);
    if (!options.properties.empty()) {
        const auto error = platform::openProperties(options.properties);
        if (error) return fail(kStatusBadInput, *error);
    }
    int listener = -1;
    if (!options.socket.empty()) {
        listener = listenAt(options.socket);
        if (listener < 0) {
            return fail(kStatusBadInput, options.socket + ": " + std::strerror(errno));
        }
    }
    const milliseconds hour(options.hourMs);
    auto* const service = new SensorService;
    if (listener >= 0) {
        std::thread(acceptClients, listener, service, hour).detach();
        std::printf("listening\n");
    }
    if (options.script.empty() && options.noClock) pause();  // clients tell the hours, and the end
    if (options.script.empty()) runClock(service, hour);
    int status = 0;
    {
        Session session(service, hour);
        status = runScript(options.script, &session);
    }
    end(service, status);
}

}  // namespace
}  // namespace host

int main(int argc, char** argv) {
    host::Options options;
    CLI::App app(
            "A sensor service around libsensor-priv, in real time. README.md lists the commands.",
            "sensor-host");
    app.add_option("--hour-ms", options.hourMs, "how long an hour lasts, in milliseconds")
            ->check(CLI::PositiveNumber);
    app.add_flag("--no-clock", options.noClock, "without a script: hours pass by command only");
    app.add_option("--socket", options.socket, "take commands of clients at a Unix socket")
            ->type_name("PATH");
    app.add_option("--properties", options.properties,
                   "keep the system properties in FILE (made if missing)")
            ->type_name("FILE");
    app.add_option("SCRIPT", options.script,
                   "take commands from this file and end with it; without one, the clock runs");
    try {
        app.parse(argc, argv);
    } catch (const CLI::ParseError& error) {
        return app.exit(error) == 0 ? 0 : host::kStatusBadInput;
    }
    return host::run(options);
}
