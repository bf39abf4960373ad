#pragma once

#include "day/Journal.h"
#include "report/page/PageModel.h"

namespace report {

/** A day of `journal` as the page shows it. */
page::Day pageDay(const day::Journal& journal, const day::Day& day);

}  // namespace report
