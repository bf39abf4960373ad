#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <string_view>

#include <utils/Mutex.h>

namespace record {

/**
 * Replaces package names by stand-ins: "app-" and ten hexadecimal digits of a keyed hash, and what
 * the library looks for in names. One name always gets the same stand-in under the same key.
 *
 * May be used from any thread.
 */
class Names {
public:
    using Key = std::array<uint64_t, 2>;

    /** The key kept in `folder`, made if it is missing. Nothing if neither can be done. */
    static std::optional<Key> loadKey(const std::string& folder);

    explicit Names(const Key& key) : mKey(key) {}

    /** The stand-in of `name`, which is noted for `replaceAll`. */
    std::string replace(const std::string& name);

    /** `payload` with a stand-in for every noted name that stands there by itself. */
    std::string replaceAll(std::string_view payload);

private:
    std::string makeStandIn(std::string_view name) const;

    const Key mKey;
    android::Mutex mLock;
    std::map<std::string, std::string> mStandIns GUARDED_BY(mLock);  // by name, plain and escaped
};

}  // namespace record
