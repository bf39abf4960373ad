#include "tests/Captures.h"

#include <cstdio>
#include <sstream>

#include "capture/CaptureImport.h"
#include "fuzz/FuzzInput.h"
#include "trace/LineReader.h"

namespace {

void add(capture::CaptureImport* import, const std::string& name, const std::string& text) {
    trace::LineReader reader(
            fuzz::readable(reinterpret_cast<const uint8_t*>(text.data()), text.size()));
    if (const auto first = reader.next()) import->add(name, *first, &reader);
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

capture::ImportedCapture importTexts(const std::vector<std::string>& texts) {
    capture::CaptureImport import;
    for (size_t i = 0; i < texts.size(); ++i) add(&import, std::to_string(i), texts[i]);
    return import.finish();
}

capture::ImportedCapture importText(const std::string& text) {
    capture::CaptureImport import;
    add(&import, "capture", text);
    return import.finish();
}

std::vector<std::string> linesWith(const std::string& part, const std::string& text) {
    std::vector<std::string> lines;
    std::istringstream stream(text);
    for (std::string line; std::getline(stream, line);) {
        if (line.find(part) != std::string::npos) lines.push_back(line);
    }
    return lines;
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

std::string report(const std::string& history, const std::string& log) {
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
