#include "support/progress.h"

namespace ingester {

Progress_Hook progress_hook = nullptr;

}  // namespace ingester
