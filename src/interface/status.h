// How a request ends.
#pragma once

#include "ingester/ingester.h"

#include <cstdint>

namespace ingester {

/// The status of the result file; the meanings stand in the public header.
enum class Request_Status : std::int32_t {
    success = INGESTER_SUCCESS,
    no_request = INGESTER_NO_REQUEST,
    input_unreadable = INGESTER_INPUT_UNREADABLE,
    input_unknown = INGESTER_INPUT_UNKNOWN,
    no_data = INGESTER_NO_DATA,
    not_imported = INGESTER_NOT_IMPORTED,
    output_failed = INGESTER_OUTPUT_FAILED,
    no_rows = INGESTER_NO_ROWS,
    inexact_sheet = INGESTER_INEXACT_SHEET,
    clipboard_failed = INGESTER_CLIPBOARD_FAILED,
    rename_failed = INGESTER_RENAME_FAILED,
    zip_unsupported = INGESTER_ZIP_UNSUPPORTED,
    nothing_selected = INGESTER_NOTHING_SELECTED,
    qtl_failed = INGESTER_QTL_FAILED,
    concatenate_failed = INGESTER_CONCATENATE_FAILED,
    qtl_options = INGESTER_QTL_OPTIONS,
    merge_failed = INGESTER_MERGE_FAILED,
    download_failed = INGESTER_DOWNLOAD_FAILED,
};

}  // namespace ingester
