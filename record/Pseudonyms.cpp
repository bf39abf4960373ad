#include "record/Pseudonyms.h"

#include <cstdio>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include "base/Json.h"

namespace record {

namespace {

/** What the library looks for in names. */
constexpr std::string_view kParts[] = {
        "com.android.incallui",
        "com.android.mms",
        "com.android.server",
        "com.android.server.display.DisplayPowerController",
        "com.android.systemui",
        "com.tencent.mm",
        "com.zuno",
};

/** A package's name that means none. */
constexpr std::string_view kUnknown = "unknown";

/** A host that makes names up does not fill the memory. */
constexpr size_t kMostSlashed = 4096;

bool contains(std::string_view text, std::string_view part) {
    return text.find(part) != std::string_view::npos;
}

bool isKept(std::string_view name) {
    if (name.empty() || name == kUnknown) return true;
    for (const std::string_view part : kParts) {
        if (name == part) return true;
    }
    return false;
}

std::string_view upToNul(std::string_view name) {
    return name.substr(0, name.find('\0'));
}

/** SipHash's state, and the steps that its authors name so. */
class SipState {
public:
    explicit SipState(const HashKey& key)
          : mV{key[0] ^ 0x736f6d6570736575, key[1] ^ 0x646f72616e646f6d,
               key[0] ^ 0x6c7967656e657261, key[1] ^ 0x7465646279746573} {}

    void compress(uint64_t word) {
        mV[3] ^= word;
        round();
        round();
        mV[0] ^= word;
    }

    uint64_t finalize() {
        mV[2] ^= 0xff;
        for (int i = 0; i < 4; ++i) round();
        return mV[0] ^ mV[1] ^ mV[2] ^ mV[3];
    }

private:
    static uint64_t rotate(uint64_t value, int bits) {
        return value << bits | value >> (64 - bits);
    }

    /** Adds the word `from` to the word `to`, and mixes the sum into a `from` turned by `bits`. */
    void mix(int to, int from, int bits) {
        mV[to] += mV[from];
        mV[from] = rotate(mV[from], bits) ^ mV[to];
    }

    void round() {
        mix(0, 1, 13);
        mV[0] = rotate(mV[0], 32);
        mix(2, 3, 16);
        mix(0, 3, 21);
        mix(2, 1, 17);
        mV[2] = rotate(mV[2], 32);
    }

    uint64_t mV[4];
};

// What is between a name and what follows it in a payload.

constexpr std::string_view kField = "pkg:";
constexpr std::string_view kJsonKey = R"("pkg" : ")";

/** The fields that may follow a name; the last one of a payload begins where its name ends. */
constexpr std::string_view kNextFields[] = {"&shockAndChargeTime:", "&time:", "&ultraEnergy:"};

size_t endOfField(std::string_view payload, size_t begin) {
    size_t end = std::string_view::npos;
    for (const std::string_view field : kNextFields) {
        const size_t at = payload.rfind(field);
        if (at != std::string_view::npos && at >= begin &&
            (end == std::string_view::npos || at > end)) {
            end = at;
        }
    }
    return end == std::string_view::npos ? payload.size() : end;
}

/** Where the JSON text ends that begins at `begin`: at its quote, or at the payload's end. */
size_t endOfText(std::string_view payload, size_t begin) {
    size_t end = begin;
    while (end < payload.size() && payload[end] != '"') end += payload[end] == '\\' ? 2 : 1;
    return end < payload.size() ? end : payload.size();
}

}  // namespace

uint64_t sipHash(const HashKey& key, std::string_view text) {
    SipState state(key);
    uint64_t word = 0;
    for (size_t i = 0; i < text.size(); ++i) {
        word |= uint64_t{static_cast<unsigned char>(text[i])} << 8 * (i % 8);
        if (i % 8 != 7) continue;
        state.compress(word);
        word = 0;
    }
    state.compress(word | uint64_t{text.size()} << 56);
    return state.finalize();
}

Error Pseudonyms::loadKey(const std::string& folder, HashKey* key) {
    const std::string path = folder + "/sensor-priv.key";
    int fd = -1;
    if (Error error = openOwnFile(path, &fd)) return error;
    constexpr ssize_t kSize = sizeof(HashKey);
    struct stat status {};
    Error error;
    if (fstat(fd, &status) != 0 || (status.st_size != 0 && status.st_size != kSize)) {
        error = complain(path, "is no key");
    } else if (status.st_size == 0) {
        const int random = open("/dev/urandom", O_RDONLY | O_CLOEXEC);
        if (read(random, key->data(), kSize) != kSize || write(fd, key->data(), kSize) != kSize) {
            [[maybe_unused]] const int cut = ftruncate(fd, 0);
            error = complain(path, "cannot be made");
        }
        close(random);
    } else if (pread(fd, key->data(), kSize, 0) != kSize) {
        error = complain(path, "cannot be read");
    }
    if (!error) error = hideFromOthers(path, fd);
    close(fd);
    return error;
}

std::string Pseudonyms::of(std::string_view name) {
    name = upToNul(name);
    if (contains(name, "/")) {
        const android::Mutex::Autolock lock(mLock);
        if (mSlashed.size() < kMostSlashed) mSlashed.emplace(name);
    }
    return make(name);
}

std::string Pseudonyms::make(std::string_view name) const {
    name = upToNul(name);
    if (isKept(name)) return std::string(name);
    char text[16];
    const uint64_t digits = sipHash(mKey, name) & 0xff'ffff'ffff;
    std::snprintf(text, sizeof(text), "app-%010llx", static_cast<unsigned long long>(digits));
    std::string pseudonym = text;
    for (const std::string_view part : kParts) {
        if (!contains(name, part)) continue;
        pseudonym += '+';
        pseudonym += part;
    }
    return pseudonym;
}

std::string Pseudonyms::replaceIn(std::string_view payload) {
    std::string result;
    const auto keep = [&](size_t count) {
        result += payload.substr(0, count);
        payload.remove_prefix(count);
    };
    // A field's name stands before all JSON: nothing in a list of names can look like one.
    const size_t field = payload.substr(0, kField.size()) == kField ? 0 : payload.find("&pkg:") + 1;
    if (field < payload.size() && payload.substr(field, kField.size()) == kField &&
        payload.find('{') > field) {
        keep(field + kField.size());
        const size_t end = endOfField(payload, 0);
        result += ofPair(std::string(payload.substr(0, end)));
        payload.remove_prefix(end);
        return result.append(payload);
    }
    for (size_t at = 0; (at = payload.find(kJsonKey)) != std::string_view::npos;) {
        keep(at + kJsonKey.size());
        const size_t end = endOfText(payload, 0);
        base::appendEscaped(&result, ofPair(base::unescape(payload.substr(0, end))));
        payload.remove_prefix(end);
    }
    return result.append(payload);
}

/** The pseudonyms of a name, or of two joined by '/'. What fits no name that was seen is one. */
std::string Pseudonyms::ofPair(const std::string& names) {
    const std::string_view text(names);
    if (!contains(text, "/") || isSlashed(text)) return make(text);
    for (size_t at = text.find('/'); at != std::string_view::npos; at = text.find('/', at + 1)) {
        const std::string_view pkg = text.substr(0, at);
        const std::string_view opPkg = text.substr(at + 1);
        if (isWhole(pkg) && isWhole(opPkg)) return make(pkg) + '/' + make(opPkg);
    }
    return make(text);
}

/** Whether `name` is one: it holds no '/', or is known to hold it. */
bool Pseudonyms::isWhole(std::string_view name) {
    name = upToNul(name);
    return !contains(name, "/") || isSlashed(name);
}

bool Pseudonyms::isSlashed(std::string_view name) {
    const android::Mutex::Autolock lock(mLock);
    return mSlashed.find(name) != mSlashed.end();
}

}  // namespace record
