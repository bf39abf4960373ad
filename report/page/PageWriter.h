#pragma once

#include <cstdio>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "report/page/PageModel.h"

namespace report::page {

/**
 * Writes the page: one HTML file that needs no network, and that works without its script. Whatever
 * a text holds, it becomes no markup and no script.
 *
 * What `add` has taken waits in an unnamed file, so that memory holds one input at a time.
 */
class PageWriter {
public:
    /** Takes an input; they stand in the order in which they come. */
    void add(const Input& input);

    bool isEmpty() const { return mNames.empty(); }

    /**
     * Writes to `file`: `first`, if there is one, then all that `add` has taken. Errors of `file`
     * show in its own state; false if what was taken is lost, with `errno`.
     */
    bool finish(std::FILE* file, const std::optional<Section>& first);

private:
    struct Close {
        void operator()(std::FILE* file) const { std::fclose(file); }
    };
    using File = std::unique_ptr<std::FILE, Close>;

    std::string contents() const;

    File mInputs;                     // their HTML
    int mError = 0;                   // of `mInputs`, as `errno` has it
    std::vector<std::string> mNames;  // of the inputs
};

}  // namespace report::page
