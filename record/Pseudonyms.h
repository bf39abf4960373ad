#pragma once

#include <array>
#include <cstdint>
#include <set>
#include <string>
#include <string_view>

#include <utils/Mutex.h>

#include "record/OwnFile.h"

namespace record {

/** The secret by which names become pseudonyms. */
using HashKey = std::array<uint64_t, 2>;

/**
 * SipHash-2-4 of `text`: without the key, nobody finds the text of a hash by trying texts. Of our
 * own, because the device's build links no library that has a keyed hash.
 */
uint64_t sipHash(const HashKey& key, std::string_view text);

/**
 * Replaces package names by pseudonyms: "app-" and ten hexadecimal digits of a keyed hash, and what
 * the library looks for in names. One name always has the same pseudonym under the same key. A name
 * ends at a NUL.
 *
 * Any thread may use it. A name costs the same however many there are.
 */
class Pseudonyms {
public:
    /** Loads the key that is kept in `folder`; makes it if it is missing. */
    static Error loadKey(const std::string& folder, HashKey* key);

    explicit Pseudonyms(const HashKey& key) : mKey(key) {}

    /** The pseudonym of `name`. */
    std::string of(std::string_view name);

    /**
     * `payload` with pseudonyms for its names. They stand behind the key "pkg": a name, or two
     * joined by '/', as a field of the payload or as a text of the JSON in it. Nothing else of the
     * payload changes.
     */
    std::string replaceIn(std::string_view payload);

private:
    std::string make(std::string_view name) const;
    std::string ofPair(const std::string& names);
    bool isWhole(std::string_view name);
    bool isSlashed(std::string_view name);

    const HashKey mKey;
    android::Mutex mLock;
    std::set<std::string, std::less<>> mSlashed GUARDED_BY(mLock);  // names that hold a '/'
};

}  // namespace record
