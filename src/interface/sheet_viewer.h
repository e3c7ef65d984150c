// A request may show its Sheet instead of writing it.
#pragma once

#include "interface/formats/format_driver.h"
#include "model/sheet.h"

#include <functional>
#include <string>
#include <vector>

namespace ingester {

/// What a request has read, as the output would get it.
struct Viewed_Sheet {
    const Sheet& sheet;
    const Format_Driver& format;          ///< of what was read, inside its compression
    bool packed;                          ///< it was compressed
    std::vector<std::string> all_sheets;  ///< names of the file's sheets, of formats that hold several
};

/// Shows it. False when that failed, after a message.
using Sheet_Viewer = std::function<bool(const Viewed_Sheet& viewed)>;

/// Empty, unless a request is to end so: then nothing is written.
extern Sheet_Viewer sheet_viewer;

}  // namespace ingester
