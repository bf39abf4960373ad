#pragma once

#include <string>

#include "report/page/PageModel.h"

namespace report::page {

/**
 * What the script draws and adds up, as JSON that can stand in a script element; times are ms:
 * `{"hours": [from, to], "days": [DAY, ...]}`. A DAY is
 *  - "bands": `[[name, [[from, to, style, facts], ...]], ...]`
 *  - "uses": for each row of the table `[[from, to, style, facts, rate, enables], ...]`; rate:
 *    samples a second, or null; enables: moments
 *  - "on", "unknown": of the display, and "unseen": `[[from, to], ...]`
 *  - "lines": `[[at, style], ...]`
 */
std::string toJson(const Input& input);

}  // namespace report::page
