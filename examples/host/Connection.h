#pragma once

#include <set>
#include <string>

namespace host {

/**
 * A client's use of sensors. Device: the service makes one for each client, and the client's calls
 * come on binder threads; the service's lock orders those of one connection.
 */
class Connection {
public:
    /**
     * `pkg` is the client's package, or the class of its listener if it is a component of the
     * system server; `opPkg` is the package that owns it.
     */
    Connection(std::string pkg, std::string opPkg);

    /** The client is gone: what it left enabled is cleaned up. */
    ~Connection();

    Connection(const Connection&) = delete;
    Connection& operator=(const Connection&) = delete;

    /** Enables a sensor, an event every `rate` nanoseconds; does nothing if it is enabled. */
    void enable(int type, long long rate);

    /** Disables a sensor; does nothing unless it is enabled. */
    void disable(int type);

private:
    const std::string mPkg;
    const std::string mOpPkg;
    std::set<int> mEnabled;  // sensor types
};

}  // namespace host
