#include "report/page/PageWriter.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstring>

#include "base/Json.h"
#include "report/Text.h"
#include "report/page/DayPicture.h"
#include "report/page/Embedded.h"
#include "report/page/Html.h"
#include "report/page/PageData.h"
#include "report/page/TableOf.h"

namespace report::page {

namespace {

// Pieces of markup that hold nothing from outside.
constexpr char kHead[] = R"html(<!DOCTYPE html>
<html lang="en">
<head>
<meta charset="utf-8">
<meta name="viewport" content="width=device-width, initial-scale=1">
)html";

constexpr char kSymbols[] = R"html(<svg class="symbols" aria-hidden="true"><defs>
<pattern id="hatch" width="6" height="6" patternUnits="userSpaceOnUse" patternTransform="rotate(45)">
<line class="hatch" y2="6"/></pattern>
<pattern id="stripes" width="6" height="6" patternUnits="userSpaceOnUse" patternTransform="rotate(45)">
<line class="stripes" y2="6"/></pattern>
<symbol id="before" overflow="visible"><path class="mark" d="M0-9-7 0 0 9z"/></symbol>
<symbol id="on" overflow="visible"><path class="mark" d="M0-9 7 0 0 9z"/></symbol>
</defs></svg>
)html";

constexpr char kControls[] = R"html(<form class="controls" id="controls" role="search" hidden>
<label>Filter <input id="filter" type="search" placeholder="app or sensor, !without" autocomplete="off" spellcheck="false"></label>
<label>From <input id="from" autocomplete="off"></label>
<label>to <input id="to" autocomplete="off"></label>
<span role="group" aria-label="Time">
<button type="button" id="earlier" aria-label="Earlier" title="Earlier (left arrow)">←</button>
<button type="button" id="later" aria-label="Later" title="Later (right arrow)">→</button>
<button type="button" id="in" aria-label="Zoom in" title="Zoom in (+)">+</button>
<button type="button" id="out" aria-label="Zoom out" title="Zoom out (-)">−</button>
<button type="button" id="all" title="All of the time (0)">All</button>
</span>
</form>
)html";

constexpr char kLegend[] = R"html(<p class="legend">
<span><svg aria-hidden="true"><rect class="slice" y="25%" width="100%" height="50%"/></svg>sensor on</span>
<span><svg aria-hidden="true"><rect class="slice unseen" y="25%" width="100%" height="50%"/></svg>its end was not seen</span>
<span><svg aria-hidden="true"><rect class="slice many" y="25%" width="100%" height="50%"/></svg>several, too close to tell apart</span>
<span><svg aria-hidden="true"><use href="#before" x="60%" y="50%"/></svg>since before</span>
<span><svg aria-hidden="true"><use href="#on" x="40%" y="50%"/></svg>still on</span>
<span><svg aria-hidden="true"><rect class="shade" width="100%" height="100%"/></svg>display on</span>
<span><svg aria-hidden="true"><rect class="charge" y="25%" width="100%" height="50%"/></svg>charging</span>
<span><svg aria-hidden="true"><rect class="unknown" width="100%" height="100%"/></svg>not known</span>
<span><svg aria-hidden="true"><line class="report" x1="50%" x2="50%" y2="100%"/></svg>report</span>
<span><svg aria-hidden="true"><line class="taken" x1="50%" x2="50%" y2="100%"/></svg>capture taken</span>
</p>
<p class="note keys" hidden><span>Keys: / filter, + and - zoom, 0 all of the time, arrows move. Tab leads to
a lane, arrows lead from use to use there. The wheel with Ctrl zooms.</span>
Drag a lane to move, pinch it to zoom; touch a bar to read what it is.</p>
)html";

constexpr char kFoot[] = R"html(</main>
<p class="telling" id="telling" role="status"></p>
<script type="module">)html";

/** Writes the HTML of one input. */
class InputHtml {
public:
    InputHtml(const Input& input, size_t number)
          : mInput(input),
            mId("input-" + std::to_string(number)) {}

    std::string make() {
        mHtml = "<section class=\"input\"" + attribute("aria-labelledby", mId) + ">\n" + "<h2" +
                attribute("id", mId) + '>' + breakable(mInput.name) + "</h2>\n";
        for (const std::string& line : mInput.lines) {
            mHtml += element("p", line, " class=\"facts-of-file\"");
        }
        addFindings();
        for (const Section& section : mInput.before) addSection(section, 3);
        addDays();
        for (const Section& section : mInput.after) addSection(section, 3);
        mHtml += element("p", mInput.end) +
                 "</section>\n<script type=\"application/json\" class=\"data\">";
        return mHtml + toJson(mInput) + "</script>\n";
    }

    static std::string html(const Section& section) {
        const Input none;
        InputHtml html(none, 0);
        html.addSection(section, 2);
        return html.mHtml;
    }

private:
    void addFindings() {
        if (mInput.findings.empty()) return;
        mHtml += "<div class=\"findings\">\n" + element("h3", "Findings");
        addList(mInput.findings);
        mHtml += "</div>\n";
    }

    void addList(const std::vector<std::string>& items) {
        mHtml += "<ul>\n";
        for (const std::string& item : items) mHtml += "<li>" + breakable(item) + "</li>\n";
        mHtml += "</ul>\n";
    }

    void addSection(const Section& section, int level) {
        mHtml += element('h' + std::to_string(std::min(level, 6)), section.heading);
        for (const std::string& line : section.lines) mHtml += element("p", line);
        for (const auto& [title, items] : section.lists) {
            if (!title.empty()) mHtml += element("p", title);
            addList(items);
        }
        for (const auto& [table, kind, caption] : section.tables) {
            addTable(tableOf(table, kind, caption));
        }
        for (const std::string& line : section.below) mHtml += element("p", line);
        if (section.isEmpty()) mHtml += element("p", "Nothing.");
        for (const Section& part : section.parts) addSection(part, level + 1);
    }

    void addDays() {
        const Span hours = hoursOf(mInput.days);
        if (hours.from < hours.to) mHtml += kLegend;
        for (const Day& day : mInput.days) {
            mHtml += "<section class=\"day\">\n" + element("h3", day.name);
            if (hours.from < hours.to) mHtml += drawDay(day, hours);
            if (day.uses) addTable(*day.uses);
            mHtml += "</section>\n";
        }
    }

    void addTable(const Table& table) {
        mHtml += "<table" + attribute("data-kind", table.kind) + ">\n";
        mHtml += element("caption", table.caption) + "<thead><tr>";
        for (const Column& column : table.columns) {
            mHtml += "<th scope=\"col\"" + classOf(column) + attribute("data-key", column.key) +
                     ">" + escape(column.title) + "</th>";
        }
        mHtml += "</tr></thead>\n<tbody>\n";
        for (const auto& row : table.rows) addRow(table, row);
        mHtml += "</tbody>\n";
        if (!table.total.empty()) {
            mHtml += "<tfoot>\n";
            addRow(table, table.total);
            mHtml += "</tfoot>\n";
        }
        mHtml += "</table>\n";
    }

    void addRow(const Table& table, const std::vector<Cell>& cells) {
        mHtml += "<tr>";
        for (size_t i = 0; i < cells.size(); ++i) {
            const Column& column = table.columns[i];
            const char* const tag = i == 0 ? "th" : "td";
            mHtml += std::string("<") + tag + (i == 0 ? " scope=\"row\"" : "") + classOf(column);
            if (i > 0 && column.kind != Column::Kind::kName && !cells[i].text.empty()) {
                mHtml += attribute("data-label", column.title);
            }
            if (cells[i].value) {
                std::string value;
                base::appendFloat(&value, static_cast<float>(*cells[i].value));
                mHtml += attribute("data-value", value);
            }
            const bool isName = column.kind == Column::Kind::kName;
            mHtml += '>' + (isName ? breakable(cells[i].text) : escape(cells[i].text)) + "</" +
                     tag + '>';
        }
        mHtml += "</tr>\n";
    }

    static std::string classOf(const Column& column) {
        switch (column.kind) {
            case Column::Kind::kName:
                return " class=\"who\"";
            case Column::Kind::kText:
                return " class=\"words\"";
            case Column::Kind::kNumber:
                return " class=\"number\"";
        }
        return {};
    }

    const Input& mInput;
    const std::string mId;  // of its heading
    std::string mHtml;
};

bool put(std::string_view text, std::FILE* file) {
    return std::fwrite(text.data(), 1, text.size(), file) == text.size();
}

bool copy(std::FILE* from, std::FILE* to) {
    if (std::fseek(from, 0, SEEK_SET) != 0) return false;
    std::array<char, 1 << 16> buffer;
    size_t size = 0;
    while ((size = std::fread(buffer.data(), 1, buffer.size(), from)) > 0) {
        if (!put({buffer.data(), size}, to)) return false;
    }
    return std::ferror(from) == 0;
}

std::string head(const std::string& title) {
    return std::string(kHead) +
           "<meta http-equiv=\"Content-Security-Policy\" content=\"default-src 'none'; "
           "style-src '" +
           kStyleHash + "'; script-src '" + kScriptHash +
           "'; base-uri 'none'; form-action 'none'\">\n" + element("title", title) + "<style>" +
           kStyle + "</style>\n</head>\n<body>\n";
}

}  // namespace

void PageWriter::add(const Input& input) {
    mNames.push_back(input.name);
    if (!mInputs && mError == 0) mInputs.reset(std::tmpfile());
    if (!mInputs || !put(InputHtml(input, mNames.size()).make(), mInputs.get())) mError = errno;
}

std::string PageWriter::contents() const {
    if (mNames.size() < 2) return {};
    std::string html = "<nav aria-label=\"Contents\">\n<ul>\n";
    for (size_t i = 0; i < mNames.size(); ++i) {
        const std::string link = "#input-" + std::to_string(i + 1);
        html += "<li><a" + attribute("href", link) + ">" + escape(mNames[i]) + "</a></li>\n";
    }
    return html + "</ul>\n</nav>\n";
}

bool PageWriter::finish(std::FILE* file, const std::optional<Section>& first) {
    errno = mError;
    if (mError != 0) return false;
    const std::string title =
            mNames.size() == 1 ? mNames[0] : std::to_string(mNames.size()) + " inputs";
    std::string html =
            head(title) + kSymbols + "<header>\n" + element("h1", "Who uses which sensor");
    html += contents() + "</header>\n" + kControls + "<main>\n";
    if (first) html += InputHtml::html(*first);
    if (!put(html, file) || (mInputs && !copy(mInputs.get(), file))) return false;
    return put(kFoot, file) && put(kScript, file) && put("</script>\n</body>\n</html>\n", file);
}

}  // namespace report::page
