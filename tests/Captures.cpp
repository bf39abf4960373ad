#include "tests/Captures.h"

#include <algorithm>
#include <cstdio>
#include <map>
#include <sstream>
#include <tuple>

#include <json/json.h>

#include "base/Json.h"
#include "base/LineReader.h"
#include "capture/CaptureImport.h"
#include "fuzz/FuzzInput.h"

namespace {

void add(capture::CaptureImport* import, const std::string& name, const std::string& text) {
    base::LineReader reader(
            fuzz::readable(reinterpret_cast<const uint8_t*>(text.data()), text.size()));
    if (const auto first = reader.next()) import->add(name, *first, &reader);
}

Json::Value parsed(const std::string& line) {
    Json::Value json;
    std::istringstream(line) >> json;
    return json;
}

/** A use as a reader of the trace sees it. */
struct Use {
    std::string pkg;
    std::optional<int64_t> uid;
    int64_t handle = 0;
    int64_t from = 0;
    bool before = false;
    int64_t enables = 0;
    int64_t periodUs = INT64_MAX;
    int64_t to = 0;
    std::string end;
    int64_t level = 0;  // 0: it has ended
};

void writeClient(const Use& use, base::JsonWriter* json) {
    json->member("pkg", use.pkg);
    if (use.uid) json->member("uid", *use.uid);
    json->member("handle", use.handle);
}

std::string beforeLine(const Use& use, int64_t periodUs, bool known) {
    std::string text;
    base::JsonWriter json(&text);
    json.beginObject().key("before").beginObject();
    writeClient(use, &json);
    json.member("periodUs", periodUs).member("known", known).endObject().endObject();
    return text;
}

std::string useLine(const Use& use) {
    std::string text;
    base::JsonWriter json(&text);
    json.beginObject().key("use").beginObject();
    writeClient(use, &json);
    json.member("from", use.from).member("before", use.before).member("enables", use.enables);
    json.member("periodUs", use.periodUs).member("to", use.to).member("end", use.end);
    json.endObject().endObject();
    return text;
}

std::string shortUse(const Use& use) {
    return (use.before ? "<" : "") + use.pkg + (use.uid ? "@" + std::to_string(*use.uid) : "") +
           ' ' + std::to_string(use.handle) + ": " + std::to_string(use.from / 1000) + '-' +
           std::to_string(use.to / 1000) + ' ' + use.end + " x" + std::to_string(use.enables) +
           ' ' + std::to_string(use.periodUs) + "us";
}

/** Follows a trace's lines by the rules that docs/trace.md gives its readers. */
class UseReader {
public:
    std::vector<std::string> before;
    std::vector<Use> ended;
    std::vector<std::string> sinceCharge;

    void take(const Json::Value& line) {
        const Json::Value& note = line["note"];
        if (note.isMember("capture")) mKnownTo = note["capture"]["knownTo"].asInt64();
        if (line["call"] == "SDCImpl.enableSuccess") takeEnable(line);
        if (note.isMember("end")) {
            const Json::Value at = note["end"].get("at", line["at"]);
            end(&useOf(note["end"]["pkg"], note["end"]), at.asInt64(),
                note["end"]["how"].asString());
        }
        if (note.isMember("taken")) takeEnd(note["taken"]);
    }

private:
    Use& useOf(const Json::Value& pkg, const Json::Value& client) {
        std::optional<int64_t> uid;
        if (client.isMember("uid")) uid = client["uid"].asInt64();
        Use& use = mUses[{pkg.asString(), uid, client["handle"].asInt64()}];
        if (use.level > 0) return use;
        use = Use();
        use.pkg = pkg.asString();
        use.uid = uid;
        use.handle = client["handle"].asInt64();
        return use;
    }

    void takeEnable(const Json::Value& line) {
        const Json::Value& args = line["args"];
        const Json::Value& note = line["note"];
        Use& use = useOf(args[2], note);
        const bool on = args[0].asBool();
        if (!on && use.level == 0) return;
        if (on && use.level == 0) {
            use.from = line["at"].asInt64();
            use.before = note["before"].asBool();
        }
        use.level = note.get("level", Json::Int64(use.level + (on ? 1 : -1))).asInt64();
        if (on) {
            ++use.enables;
            use.periodUs = std::min<int64_t>(use.periodUs, args[4].asInt64() / 1000);
        } else if (use.level == 0) {
            end(&use, line["at"].asInt64(), "off");
        }
        if (note["before"].asBool()) {
            before.push_back(beforeLine(use, args[4].asInt64() / 1000,
                                        note.get("rateKnown", true).asBool()));
        }
    }

    void takeEnd(const Json::Value& taken) {
        for (auto& [client, use] : mUses) {
            if (use.level > 0) end(&use, mKnownTo, "on");
        }
        for (const Json::Value& row : taken["sinceCharge"]["rows"]) {
            std::string& text = sinceCharge.emplace_back();
            base::JsonWriter json(&text);
            json.beginObject().key("sinceCharge").beginObject();
            for (const char* key : {"uid", "handle", "ms", "count", "backgroundMs"}) {
                json.member(key, row[key].asInt64());
            }
            json.endObject().endObject();
        }
    }

    void end(Use* use, int64_t at, const std::string& how) {
        use->to = at;
        use->end = how;
        ended.push_back(*use);
        use->level = 0;
    }

    int64_t mKnownTo = 0;
    std::map<std::tuple<std::string, std::optional<int64_t>, int64_t>, Use> mUses;
};

UseReader readUses(const std::string& trace) {
    UseReader reader;
    std::istringstream stream(trace);
    for (std::string line; std::getline(stream, line);) reader.take(parsed(line));
    return reader;
}

Imported finish(capture::CaptureImport* import) {
    auto imported = import->finish();
    if (!imported) return {"", {}, imported.error().text};
    return {imported->trace, imported->warnings, ""};
}

std::string timeOf(long long at) {
    char text[40];
    const long long second = at / 1000 % 86400;
    std::snprintf(text, sizeof(text), "%02lld:%02lld:%02lld", second / 3600, second / 60 % 60,
                  second % 60);
    return (at < 86'400'000 ? "" : "+" + std::to_string(at / 86'400'000) + " ") + text;
}

/** "d2" of a state's call, else nothing. */
std::string stateOf(const std::string& line) {
    const auto [letter, start] = line.find("[[2, 0, ") != line.npos      ? std::pair('d', 1)
                                 : line.find("ChargeState") != line.npos ? std::pair('p', 1)
                                 : line.find("[[10, 0, ") != line.npos   ? std::pair('c', 1)
                                 : line.find("[[7, 0, ") != line.npos    ? std::pair('t', 1)
                                                                         : std::pair(' ', 0);
    if (start == 0) return "";
    return std::string(1, letter) + line[line.find_last_of("0123456789")];
}

}  // namespace

Imported importTexts(const std::vector<std::string>& texts) {
    capture::CaptureImport import;
    for (size_t i = 0; i < texts.size(); ++i) add(&import, std::to_string(i), texts[i]);
    return finish(&import);
}

Imported importText(const std::string& text) {
    capture::CaptureImport import;
    add(&import, "capture", text);
    return finish(&import);
}

std::vector<std::string> linesWith(const std::string& part, const std::string& text) {
    std::vector<std::string> lines;
    std::istringstream stream(text);
    for (std::string line; std::getline(stream, line);) {
        if (line.find(part) != std::string::npos) lines.push_back(line);
    }
    return lines;
}

std::vector<std::string> callsWith(const std::string& part, const std::string& trace) {
    std::vector<std::string> calls;
    for (const std::string& line : linesWith("\"call\"", trace)) {
        const size_t note = line.find(", \"note\": ");
        if (line.find(part) >= note || line.find("\"before\": true", note) < line.size()) continue;
        calls.push_back(note == std::string::npos ? line : line.substr(0, note) + "}");
    }
    return calls;
}

trace::Note noteWith(const std::string& part, const std::string& trace) {
    const auto lines = linesWith(part, trace);
    if (lines.empty()) return {};
    const size_t note = lines[0].find("\"note\": ") + 8;
    return trace::parseNote(std::string_view(lines[0]).substr(note, lines[0].size() - note - 1));
}

std::vector<std::string> usesOf(const std::string& trace) {
    const UseReader reader = readUses(trace);
    std::vector<std::string> lines = reader.before;
    for (const Use& use : reader.ended) lines.push_back(useLine(use));
    lines.insert(lines.end(), reader.sinceCharge.begin(), reader.sinceCharge.end());
    return lines;
}

std::string shortUsesOf(const std::string& trace) {
    std::string text;
    for (const Use& use : readUses(trace).ended) text += (text.empty() ? "" : ", ") + shortUse(use);
    return text;
}

std::string statesOf(const std::string& trace) {
    std::string states;
    std::string last;
    for (const std::string& line : linesWith("\"call\"", trace)) {
        const std::string state = stateOf(line);
        if (state.empty()) continue;
        const std::string time = timeOf(std::stoll(line.substr(line.find(' '))));
        states += (time == last ? " " : (states.empty() ? "" : ", ") + time + " ") + state;
        last = time;
    }
    return states;
}

const std::string kSensors =
        "Sensor List:\n"
        "0000000000) Zero | Maker | ver: 1 | type: android.sensor.accelerometer(1) | perm: n/a\n"
        "\tcontinuous | minRate=1.00Hz\n"
        "0x5f636779) Name (with) brackets | Maker | ver: 1 | type: com.maker.magic(65537) | perm: "
        "n/a | flags: 0x00000000\n";

std::string bugReport(const std::string& history, const std::string& log) {
    const std::string section = "DUMP OF SERVICE ";
    return "== dumpstate: 2024-05-02 11:59:00\n"
           "------ EVENT LOG (logcat -b events) ------\n" +
           log + "------ 0.1s was the duration of 'EVENT LOG' ------\n" + section +
           "batterystats:\nBattery History (1% used, 1KB used of 256KB, 1 strings using 3):\n" +
           history + "\n" + section + "CRITICAL sensorservice:\n" + kSensors +
           "Previous Registrations:\n"
           "10:00:00 - 0x00000000 pid=    1 uid=    1 package=a\n"
           "--------- 0.1s was the duration of dumpsys sensorservice, ending at: 2024-05-02 "
           "12:00:00\n";
}
