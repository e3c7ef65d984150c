/*
 * The call interface of libingester, for C (C99) and C++.
 *
 * A host leaves a request in the temporary folder (TMPDIR, else TMP, else TEMP, else /tmp), calls
 * INGESTER, and reads the answer from the same folder. With <pid> the number of the calling process:
 *
 *   IG<pid>.inp   the request ("pass file"), written by the host, deleted by the library unless it
 *                 is faulty or its secondary file can't be fetched
 *   IG<pid>.out   the result: a 32-bit status and a 32-bit 0; absent when a secondary file that a URL
 *                 names can't be fetched
 *   IG<pid>.ERR   messages for the user; absent when there are none, else closed by a line ":"
 *
 * A pass file is little-endian: a double, the number of arguments (2 to 6); then as many text
 * records of a 32-bit 0, a 32-bit length and that many bytes: the input file, the output file, the
 * worksheet, the cell range, a secondary file and a subset file. Names of files may carry slash
 * options, so their folders are written with backslashes.
 *
 * What serves people better than hosts count on is off unless the input or the output file string asks
 * for it, by keys that begin with "/+", as no other key does:
 *
 *   /+people         all of these rules
 *   /+utf8           texts are UTF-8 instead of Windows-1252, but for the host's own files
 *   /+names          names of columns stand as they are until an output can't hold them
 *   /+losses         what could not be kept is told at the end of the messages
 *   /+vain           options that mean nothing to the input are told
 *   /+endings        outputs are known by further endings, and packed where they end in .gz
 *   /+types          inputs are recognised by further tests
 *   /+levels         joins match levels by what they say, and add those that are new
 *   /+dates          dates are read in more of their usual forms
 *   /+plain          comma text and tabs are written as other programs take them
 *   /+dialect        a text is cut and typed as its lines tell, and numbers keep their spelling
 *   /+calendar       dates of statistics files come and go by the calendar
 *   /+whole          texts of statistics files stay whole
 *
 * and beside these rules:
 *
 *   /+strict         anything that can't be kept makes the request fail, and the old output stays
 *   /+report=FILE    what could not be kept is written into a file, as JSON
 *   /+separator=SIGN, /+quote=SIGN, /+decimal=SIGN, /+header=N, /+skip=N, /+table=N, /+missing=A,B
 *                    what a text's dialect is, in the place of what its lines tell
 *   /+encoding=NAME  the code of the input's texts, as UTF-8, latin1 or 850
 *   /+marks          of such texts names tell types, and * is missing
 *   /+crlf           their lines end with CR LF
 *   /+write-encoding=NAME  the code of texts that are written
 *   /+bom            they begin with the mark of Unicode
 *   /+secondary=FILE the secondary file, where its record in the pass file holds a list
 *
 * One call at a time in a process; calls may follow each other.
 */
#ifndef INGESTER_INGESTER_H
#define INGESTER_INGESTER_H

#include <stdint.h>

#if defined(__GNUC__)
#define INGESTER_EXPORT __attribute__((visibility("default")))
#else
#define INGESTER_EXPORT
#endif

#ifdef __cplusplus
extern "C" {
#endif

/* The status that a result file begins with. */
enum ingester_status {
    INGESTER_SUCCESS = 0,
    INGESTER_NO_REQUEST = 1,       /* the pass file was not found, or is faulty */
    INGESTER_INPUT_UNREADABLE = 2, /* the input can't be opened, or is empty */
    INGESTER_INPUT_UNKNOWN = 3,    /* no known file type */
    INGESTER_NO_DATA = 4,          /* data could not be read, or all of it is empty */
    INGESTER_NOT_IMPORTED = 5,     /* no data imported; an operation on them failed */
    INGESTER_OUTPUT_FAILED = 6,    /* the output could not be written */
    INGESTER_NO_ROWS = 7,          /* success, with zero rows */
    INGESTER_INEXACT_SHEET = 8,    /* no data after an inexact sheet match; adding failed */
    INGESTER_CLIPBOARD_FAILED = 9,
    INGESTER_RENAME_FAILED = 10, /* the finished output could not take its name */
    INGESTER_ZIP_UNSUPPORTED = 11,
    INGESTER_NOTHING_SELECTED = 13, /* no columns or rows selected, or data could not be appended */
    INGESTER_QTL_FAILED = 14,
    INGESTER_CONCATENATE_FAILED = 15, /* the tables can't stand beside each other */
    INGESTER_QTL_OPTIONS = 16,
    INGESTER_MERGE_FAILED = 17, /* a key of a merge was not found, or merging failed */
    INGESTER_DOWNLOAD_FAILED = 19
};

/*
 * Runs one request. Both names are arrays of characters with their lengths, without terminators,
 * with native separators or backslashes; a length of 0 means none.
 *
 *   pass_name    of the host's carrier file, used only when IG<pid>.inp does not exist: a small file
 *                whose head holds a request id, so that the names above become IG<ID>.tmp,
 *                IG<ID>.out and IG<ID>.ERR with the id in upper-case hexadecimal; without an id
 *                they are ingester.inp, ingester.out and TxtToNum.ERR
 *   result_name  replaces the name of the result file
 *
 * Always returns 0: success or failure is in the result file, and failure to fetch a secondary file is that
 * there is none.
 */
INGESTER_EXPORT int32_t INGESTER(const char* pass_name, const char* result_name, int32_t pass_name_length,
                                 int32_t result_name_length);

#ifdef __cplusplus
}
#endif

#endif
