#include "record/Run.h"

namespace record {

thread_local Run* Run::tCurrent = nullptr;

}  // namespace record
