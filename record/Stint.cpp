#include "record/Stint.h"

namespace record {

thread_local Stint* Stint::tCurrent = nullptr;

}  // namespace record
