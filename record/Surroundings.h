#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <set>
#include <string>
#include <vector>

namespace record {

/**
 * What the library reads of the device beside its calls: the exported variables and the system
 * properties. Says what of it a replay does not know yet. Not safe for threads by itself.
 */
class Surroundings {
public:
    Surroundings();

    /** Looks at the variables. Returns a "set" line's body for those that have changed, or "". */
    std::string takeVariables();

    /**
     * Looks at the properties, or at the one that is called `only`. Returns a "property" line's
     * body likewise.
     */
    std::string takeProperties(const char* only = nullptr);

    // The library begins, or ends, to set a property. A replay lets it succeed, whatever the device
    // says. In between nobody knows which value a look at it would find, so none is taken.
    void beginWrite(const std::string& name, const std::string& value);
    void endWrite(const std::string& name);

    /** A replay that begins now knows nothing. */
    void forget();

private:
    struct Variable {
        const char* name;
        const void* address;  // null: the host's library does not have it
        bool isBool;
        std::optional<int32_t> known;
    };

    std::vector<Variable> mVariables;
    std::map<std::string, std::string> mKnownProperties;  // unset: ""
    std::multiset<std::string> mBeingWritten;
};

}  // namespace record
