#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
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

    // Look at the properties, or at one that the library reads. Return a "property" line's body
    // likewise.
    std::string takeProperties();
    std::string takeProperty(std::string_view name);

    // The library begins, or ends, to set a property. A replay lets it succeed, whatever the device
    // says. In between nobody knows which value a look at it would find, so none is taken.
    void beginWrite(std::string_view name, const std::string& value);
    void endWrite(std::string_view name);

    /** A replay that begins now knows nothing. */
    void forget();

private:
    struct Variable {
        const char* name;
        const void* address;  // null: the host's library does not have it
        bool isBool;
        std::optional<int32_t> known;
    };

    struct Property {
        std::string_view name;             // ends with a NUL
        std::optional<std::string> known;  // unset: ""
        int writes;                        // that have begun and not ended
    };

    void take(Property* property, std::string* members);
    Property* find(std::string_view name);

    std::vector<Variable> mVariables;
    std::vector<Property> mProperties;
};

}  // namespace record
