#pragma once

#include <string>

#include "report/Table.h"
#include "report/page/PageModel.h"

namespace report::page {

/**
 * `table`, whose columns "App" and "Sensor" say what a row is, for the page. A column that says
 * nothing in any row is left out.
 */
Table tableOf(const report::Table& table, const std::string& kind, const std::string& caption);

}  // namespace report::page
