#pragma once

#include <chrono>
#include <iosfwd>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "examples/host/Connection.h"

namespace host {

class SensorService;

/**
 * What a script, or a client at the socket, lets the service do: plain commands, a line each, as
 * README.md lists them. To be used by one thread. Its connections end with it.
 */
class Session {
public:
    /** `hour` is how long an hour lasts. Neither takes ownership of the service nor starts it. */
    Session(SensorService* service, std::chrono::milliseconds hour);

    /** Carries a line out. Returns nothing, or what is wrong with it: then nothing has been done.
     */
    std::optional<std::string> run(const std::string& line);

    /** Whether `stop` has come. */
    bool isOver() const { return mOver; }

private:
    using Error = std::optional<std::string>;

    struct Command {
        const char* name;
        const char* arguments;
        Error (*run)(Session* session, const Command& command, std::istream& words);
    };
    static const Command kCommands[];

    /** Reads the arguments of `operation` from `words` and calls it, if they fit. */
    template <auto operation>
    static Error call(Session* session, const Command& command, std::istream& words);
    template <typename Class, typename Result, typename... Arguments>
    Error call(Result (Class::*operation)(Arguments...), const Command& command,
               std::istream& words);

    // The commands that are not the service's own.
    void enable(const std::string& pkg, const std::string& opPkg, int type, long long rate);
    Error disable(const std::string& pkg, const std::string& opPkg, int type);
    Error disconnect(const std::string& pkg, const std::string& opPkg);
    Error event(int type, const std::vector<float>& data);
    Error change(const std::string& what);
    Error set(const std::string& name, int value);
    Error hours(int first, int last);
    Error show(int red, int green, int blue);
    Error setProperty(const std::string& name, const std::string& value);
    void printProperty(const std::string& name);
    void sleep(int milliseconds);
    void stop() { mOver = true; }

    SensorService* const mService;
    const std::chrono::milliseconds mHour;
    std::map<std::pair<std::string, std::string>, std::unique_ptr<Connection>> mConnections;
    bool mOver = false;
};

}  // namespace host
