#include "capture/text/TextSource.h"

#include <algorithm>
#include <cstdlib>
#include <functional>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include <archive.h>
#include <archive_entry.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include "base/FileIo.h"
#include "fuzz/FuzzInput.h"
#include "tests/ReplayTool.h"

namespace {

using Entries = std::vector<std::pair<std::string, std::string>>;

/** Larger than the blocks in which it is read; with a NUL and invalid UTF-8. */
std::string longText() {
    std::string text("\0\xFF\xC3(", 4);
    for (int i = 0; i < 60'000; ++i) text += std::to_string(i) + (i % 7 == 0 ? "\n" : ", ");
    return text;
}

const std::string kText = longText();

/** What libarchive packs; the sizes stand behind the entries, as in a device's zip. */
std::string packed(const std::function<void(archive*)>& setUp, const Entries& entries) {
    std::string bytes(kText.size() * 2 + 100'000, '\0');
    archive* writer = archive_write_new();
    setUp(writer);
    size_t used = 0;
    archive_write_set_bytes_in_last_block(writer, 1);
    archive_write_open_memory(writer, bytes.data(), bytes.size(), &used);
    for (const auto& [name, text] : entries) {
        archive_entry* entry = archive_entry_new();
        archive_entry_set_pathname(entry, name.c_str());
        archive_entry_set_filetype(entry, AE_IFREG);
        archive_entry_set_perm(entry, 0644);
        EXPECT_EQ(archive_write_header(writer, entry), ARCHIVE_OK) << archive_error_string(writer);
        archive_write_data(writer, text.data(), text.size());
        archive_entry_free(entry);
    }
    archive_write_free(writer);
    bytes.resize(used);
    return bytes;
}

std::string zip(const Entries& entries, const char* encryption = nullptr) {
    return packed(
            [&](archive* writer) {
                archive_write_set_format_zip(writer);
                if (encryption == nullptr) return;
                archive_write_set_options(writer, encryption);
                archive_write_set_passphrase(writer, "secret");
            },
            entries);
}

std::string gzip(const std::string& text) {
    return packed(
            [](archive* writer) {
                archive_write_add_filter_gzip(writer);
                archive_write_set_format_raw(writer);
            },
            {{"text", text}});
}

std::string utf16(std::initializer_list<unsigned> units, bool bigEndian) {
    std::string text;
    for (const unsigned unit : units) {
        const char high = static_cast<char>(unit >> 8);
        const char low = static_cast<char>(unit);
        text += bigEndian ? std::string{high, low} : std::string{low, high};
    }
    return text;
}

/** All that comes out, or "error: " and why nothing does. */
std::string unpacked(int fd) {
    const auto opened = capture::openText(fd);
    if (!opened) return "error: " + opened.error().text;
    std::string text;
    char block[1000];
    ssize_t count;
    while ((count = opened->text->read(block, sizeof(block))) > 0) {
        text.append(block, static_cast<size_t>(count));
    }
    return count < 0 ? "error: " + opened->text->error() : text;
}

std::string fromFile(const std::string& bytes) {
    return unpacked(fuzz::readable(reinterpret_cast<const uint8_t*>(bytes.data()), bytes.size()));
}

std::string fromPipe(const std::string& bytes) {
    int ends[2];
    EXPECT_EQ(pipe(ends), 0);
    std::thread writer([&] {
        for (size_t i = 0; i < bytes.size(); i += i < 3 ? 1 : 5000) {
            base::writeAll(ends[1], &bytes[i],
                           std::min<size_t>(i < 3 ? 1 : 5000, bytes.size() - i));
        }
        close(ends[1]);
    });
    std::string text = unpacked(ends[0]);
    writer.join();
    return text;
}

TEST(TextSourceTest, FindsTheTextInWhateverItComesFromFilesAndPipes) {
    struct Case {
        const char* what;
        std::string bytes;
        std::string text;
    };
    const std::string name = "bugreport-A-2024.txt";
    const std::string mark = "\xEF\xBB\xBF";
    for (const auto& [what, bytes, text] : std::vector<Case>{
                 {"nothing", "", ""},
                 {"plain", kText, kText},
                 {"a start as of a zip", "P", "P"},
                 {"gzip", gzip(kText), kText},
                 {"several gzips and padding", gzip(kText) + gzip("b") + std::string(20, '\0'),
                  kText + "b"},
                 {"gzip and something else", gzip("a") + std::string(70'000, '\0') + "b",
                  "error: the gzip file is damaged: something else follows it"},
                 {"UTF-16, little end first",
                  utf16({0xFEFF, 'a', 0xE4, 0x4E2D, 0xD83D, 0xDE00, '\n'}, false),
                  "a\u00e4\u4e2d\U0001F600\n"},
                 {"UTF-16, big end first, with lone halves",
                  utf16({0xFEFF, 0xD83D, 'a', 0xDE00, 0xD83D}, true), "\uFFFDa\uFFFD\uFFFD"},
                 {"UTF-16 that ends in half a unit", utf16({0xFEFF, 'a'}, false) + "b", "a\uFFFD"},
                 {"UTF-16 of nothing", utf16({0xFEFF}, false), ""},
                 {"gzip of UTF-16", gzip(utf16({0xFEFF, 'a', '\n'}, true)), "a\n"},
                 {"zip with a main entry",
                  zip({{"x/" + name, "no"},
                       {"bugreport-B.txt", "no"},
                       {"main_entry.txt", name + "\r\n"},
                       {name, mark + kText}}),
                  mark + kText},
                 {"zip that names the entry before it",
                  zip({{name, "yes"}, {"main_entry.txt", name}}), "yes"},
                 {"zip without a main entry",
                  zip({{"bugreport/bugreport.txt", "no"}, {name, kText}, {"bugreport.png", "no"}}),
                  kText},
                 {"zip of UTF-16", zip({{name, utf16({0xFEFF, 'a'}, false)}}), "a"},
                 {"zip in a zip",
                  zip({{"__MACOSX/._b.zip", "no"}, {"a/b.zip", zip({{name, kText}})}}), kText},
                 {"zip in a gzip", gzip(zip({{name, "a"}})), "a"},
                 {"zip in a zip in a zip", zip({{"a.zip", zip({{"b.zip", zip({{name, "a"}})}})}}),
                  "error: packed too often: only a zip or gzip in another is opened"},
                 {"zip of several zips", zip({{"a.zip", "a"}, {"b.zip", "b"}}),
                  "error: no bug report in the zip, but several zips"},
                 {"zip without a report", zip({{"a.txt", "no"}}),
                  "error: no bug report in the zip"},
                 {"zip of several reports", zip({{name, "a"}, {"bugreport.txt", "b"}}),
                  "error: several bug reports in the zip, and none is named"},
                 {"zip that names what it lacks", zip({{"main_entry.txt", "b.txt"}, {name, "a"}}),
                  "error: the zip lacks the bug report that main_entry.txt names"},
                 {"encrypted zip", zip({{name, "a"}}, "zip:encryption=traditional"),
                  "error: the zip is encrypted"},
                 {"AES-encrypted zip",
                  zip({{"main_entry.txt", name}, {name, "a"}}, "zip:encryption=aes256"),
                  "error: the zip is encrypted"},
                 {"zip whose headers differ", zip({{"bugreport.txt", "a"}}).replace(14, 1, "\1"),
                  "error: the zip is damaged: Inconsistent CRC32 values"},
                 {"no zip", "PK\x03\x04 is not enough",
                  "error: the zip is damaged: Unrecognized archive format"},
         }) {
        EXPECT_TRUE(fromFile(bytes) == text) << what << ": " << fromFile(bytes).substr(0, 200);
        EXPECT_TRUE(fromPipe(bytes) == text) << what;
    }
}

TEST(TextSourceTest, NoDamageChangesTheText) {
    const std::string name = "bugreport.txt";
    const std::string text = kText.substr(0, 100);
    const std::string report = zip({{"main_entry.txt", name}, {name, text}});
    const auto isError = [](const std::string& got) { return got.rfind("error: ", 0) == 0; };
    for (const auto& [whole, step] :
         std::vector<std::pair<std::string, size_t>>{{gzip(text), 1},
                                                     {report, 1},
                                                     {zip({{"b.zip", report}}), 9},
                                                     {gzip(kText), 9000},
                                                     {zip({{name, kText}}), 9000}}) {
        const std::string good = fromFile(whole);
        for (size_t at = 2; at < whole.size(); at += step) {
            EXPECT_TRUE(isError(fromFile(whole.substr(0, at)))) << at;
            for (size_t bit = at % 2; bit < 8; bit += 2) {
                std::string bytes = whole;
                bytes[at] = static_cast<char>(bytes[at] ^ 1 << bit);
                const std::string got = fromFile(bytes);
                EXPECT_TRUE(got == good || isError(got)) << at << ", bit " << bit << ": " << got;
            }
        }
    }
}

class PackedCaptureTest : public ReplayToolTest {};

TEST_F(PackedCaptureTest, IsPlayedLikeTheTextInIt) {
    const std::string text =
            "Sensor List:\n0x00000001) A | M | ver: 1 | type: t(1) | perm: n/a\n"
            "Previous Registrations:\n01:00:00 - 0x00000001 pid=1 uid=1 package=a\n";
    write("plain", text);
    write("zip", zip({{"bugreport.txt", "\xEF\xBB\xBF" + text}}));
    write("gz", gzip(text));
    const Played plain = run("--json plain");
    EXPECT_EQ(plain.status, 0);
    for (const char* input : {"zip", "gz"}) {
        EXPECT_EQ(run(std::string("--json ") + input).out, plain.out);
        EXPECT_EQ(run("--json - plain", read(input)).status, 0);
    }
    const auto behindNames = [](const std::string& trace) {
        return trace.substr(trace.find('\n'));
    };
    EXPECT_EQ(behindNames(run("--merge --print-trace zip gz plain").out),
              behindNames(run("--print-trace plain").out));
    write("trace", gzip("{\"at\": 0}\n"));
    EXPECT_EQ(run("trace").err, "trace: a trace must be plain UTF-8, not packed or UTF-16\n");
    std::string broken = gzip(text + kText);
    write("broken", broken.substr(0, broken.size() / 2));
    const Played failed = run("--json plain broken");
    EXPECT_EQ(failed.status, 2);
    EXPECT_NE(failed.err.find("broken:"), std::string::npos);
    EXPECT_NE(failed.err.find("the gzip file is damaged: it ends early\n"), std::string::npos);
}

TEST_F(PackedCaptureTest, IsRefusedIfItIsEmpty) {
    write("comment", "# a\n");
    EXPECT_EQ(run("comment /dev/null").status, 0);
    for (const std::string& input : {std::string(), std::string("\r\n \t\n"), gzip("")}) {
        EXPECT_EQ(run("comment -", input).err,
                  "-: empty: adb leaves such a file when it finds no device\n");
    }
    EXPECT_EQ(run("/dev/null").status, 2);
}

}  // namespace
