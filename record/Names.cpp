#include "record/Names.h"

#include <cstdio>

#include <fcntl.h>
#include <unistd.h>

#include "record/JsonText.h"

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

uint64_t rotate(uint64_t value, int bits) {
    return value << bits | value >> (64 - bits);
}

/** SipHash-2-4 of `text`: without the key, nobody finds the name of a hash by trying names. */
uint64_t hash(const Names::Key& key, std::string_view text) {
    uint64_t v[] = {key[0] ^ 0x736f6d6570736575, key[1] ^ 0x646f72616e646f6d,
                    key[0] ^ 0x6c7967656e657261, key[1] ^ 0x7465646279746573};
    const auto round = [&v] {
        v[0] += v[1], v[1] = rotate(v[1], 13) ^ v[0], v[0] = rotate(v[0], 32);
        v[2] += v[3], v[3] = rotate(v[3], 16) ^ v[2];
        v[0] += v[3], v[3] = rotate(v[3], 21) ^ v[0];
        v[2] += v[1], v[1] = rotate(v[1], 17) ^ v[2], v[2] = rotate(v[2], 32);
    };
    const auto take = [&](uint64_t word) { v[3] ^= word, round(), round(), v[0] ^= word; };
    uint64_t word = 0;
    for (size_t i = 0; i < text.size(); ++i) {
        word |= uint64_t{static_cast<unsigned char>(text[i])} << 8 * (i % 8);
        if (i % 8 == 7) take(word), word = 0;
    }
    take(word | uint64_t{text.size()} << 56);
    v[2] ^= 0xff;
    for (int i = 0; i < 4; ++i) round();
    return v[0] ^ v[1] ^ v[2] ^ v[3];
}

bool isEdge(std::string_view text, size_t i, std::string_view edges) {
    return i >= text.size() || edges.find(text[i]) != std::string_view::npos;
}

}  // namespace

std::optional<Names::Key> Names::loadKey(const std::string& folder) {
    const std::string path = folder + "/sensor-priv.key";
    Key key{};
    const int fd = open(path.c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0600);
    if (fd < 0) return std::nullopt;
    bool valid = pread(fd, key.data(), sizeof(key), 0) == sizeof(key);
    if (!valid) {
        const int random = open("/dev/urandom", O_RDONLY | O_CLOEXEC);
        valid = read(random, key.data(), sizeof(key)) == sizeof(key) &&
                write(fd, key.data(), sizeof(key)) == sizeof(key);
        close(random);
    }
    close(fd);
    return valid ? std::optional(key) : std::nullopt;
}

std::string Names::replace(const std::string& name) {
    if (isKept(name)) return name;
    const android::Mutex::Autolock lock(mLock);
    const auto [entry, isNew] = mStandIns.try_emplace(name);
    if (!isNew) return entry->second;
    entry->second = makeStandIn(name);
    std::string escaped;  // as it stands in the lists of a payload
    appendEscaped(&escaped, name);
    mStandIns.emplace(std::move(escaped), entry->second);
    return entry->second;
}

std::string Names::replaceAll(std::string_view payload) {
    const android::Mutex::Autolock lock(mLock);
    std::string result;
    for (size_t i = 0; i < payload.size();) {
        const std::pair<const std::string, std::string>* longest = nullptr;
        for (const auto& entry : mStandIns) {
            const std::string& name = entry.first;
            if (longest != nullptr && name.size() <= longest->first.size()) continue;
            if (payload.compare(i, name.size(), name) == 0 && isEdge(payload, i - 1, ":/\"") &&
                isEdge(payload, i + name.size(), "/&\"")) {
                longest = &entry;
            }
        }
        result += longest != nullptr ? longest->second : std::string(1, payload[i]);
        i += longest != nullptr ? longest->first.size() : 1;
    }
    return result;
}

std::string Names::makeStandIn(std::string_view name) const {
    char text[16];
    const uint64_t digits = hash(mKey, name) & 0xff'ffff'ffff;
    std::snprintf(text, sizeof(text), "app-%010llx", static_cast<unsigned long long>(digits));
    std::string standIn = text;
    for (const std::string_view part : kParts) {
        if (!contains(name, part)) continue;
        standIn += '+';
        standIn += part;
    }
    return standIn;
}

}  // namespace record
