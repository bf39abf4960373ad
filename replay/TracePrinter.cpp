#include "replay/TracePrinter.h"

#include <cstdio>
#include <new>
#include <string>
#include <vector>

#include "base/Json.h"
#include "replay/InputFile.h"
#include "report/Stdout.h"

namespace replay {

base::Result<void> printTraces(const Options& options) {
    std::vector<std::vector<std::string>> captures;
    if (options.merge) captures.push_back(options.files);
    for (size_t i = 0; !options.merge && i < options.files.size(); ++i) {
        captures.push_back({options.files[i]});
    }
    report::Stdout out;
    for (const auto& files : captures) {
        const auto imported = importCaptures(files, options.inputs());
        if (!imported) return tl::unexpected(imported.error());
        for (const std::string& warning : imported->warnings) {
            std::fprintf(stderr, "%s\n", warning.c_str());
        }
        if (&files != &captures.front()) {
            std::string line;
            base::JsonWriter json(&line);
            json.beginObject().member("at", imported->start).member("boot", "device").endObject();
            out.write(line + '\n');
        }
        out.write(imported->trace);
        out.flush();
    }
    return {};
}

}  // namespace replay
