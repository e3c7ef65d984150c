// The rows of statistics packages, databases and matrices.
#pragma once

#include "interface/file_detection.h"
#include "interface/formats/format_driver.h"
#include "statfiles/sas/sas.h"
#include "statfiles/spss/spss.h"

namespace ingester {

constexpr std::string_view Sas_Transport_Instead = "SAS transport (.xpt)";

constexpr Format_Driver Statfiles_Formats[] = {
    {.code = 3, .name = "dBase table", .extensions = ".dbf", .max_columns = 511},
    {.code = 7, .name = "Minitab worksheet"},
    {.code = 9, .name = "Paradox table"},
    {.code = 10,
     .name = "SAS Version 6 data set",
     .read = Any_Code<Read_Sas_Data_Set>,
     .options = "encoding"},
    {.code = 13, .name = "S-Plus data object"},
    {.code = 14, .name = "S-Plus dump of a data frame", .extensions = ".sdd"},
    {.code = 15, .name = "Instat worksheet", .extensions = ".wor", .max_columns = 224},
    {.code = 16, .name = "binary dictionary with data"},
    {.code = 18, .name = "Gauss data", .extensions = ".fmt"},
    {.code = 20, .name = "MATLAB Level 4 matrix", .extensions = ".mat"},
    {.code = 21, .name = "Systat"},
    {.code = 22,
     .name = "SPSS system file",
     .read = Any_Code<Read_Spss_System_File>,
     .options = "/i /r encoding",
     .people_extensions = ".sav .zsav",
     .instead = Sas_Transport_Instead},
    {.code = 23, .name = "Stata data set", .people_extensions = ".dta"},
    {.code = 28,
     .name = "SAS transport",
     .read = Any_Code<Read_Sas_Transport>,
     .options = "encoding",
     .sheet_names = Read_Sas_Member_Names,
     .lists_sheets = true,
     .extensions = ".tpt",
     .people_extensions = ".xpt",
     .write = Write_Sas_Transport,
     .unique_names = true},
    {.code = 35, .name = "Statistica, first generation"},
    {.code = 36, .name = "Statistica, second generation"},
    {.code = 37, .name = "SAS data set", .extensions = ".ssd .sas7bdat .ssd01"},
    {.code = 38, .name = "Minitab portable worksheet"},
    {.code = 39, .name = "WEKA ARFF", .extensions = ".arf .arff"},
    {.code = 40, .name = "Visualist Tablet", .lists_sheets = true, .extensions = ".vtb"},
    {.code = 41, .name = "S-Plus dump"},
    {.code = r_data_file, .name = "R data", .extensions = ".rda .rdata"},
    {.code = r_text_file,
     .name = "R data in text form",
     .clipboard_extensions = ".rda",
     .unique_names = true},
    {.code = 44,
     .name = "SPSS system file of the early form",
     .read = Any_Code<Read_Spss_Pc_File>,
     .options = "/i /r encoding"},
    {.code = 45,
     .name = "SPSS portable",
     .read = Any_Code<Read_Spss_Portable>,
     .options = "/i /r encoding",
     .people_extensions = ".por",
     .instead = Sas_Transport_Instead},
    {.code = 46, .name = "data set read through the bridge"},
    {.code = 47, .name = "data set read through the bridge"},
    {.code = 68, .name = "Statistica, third generation"},
    {.code = 71, .name = "StatGraphics"},
    {.code = 76, .name = "MATLAB file, through the bridge"},
    {.code = 77, .name = "EViews workfile, through the bridge"},
    {.code = 78, .name = "Stata XML data set, through the bridge"},
    {.code = 79, .name = "RATS data, through the bridge"},
    {.code = 80, .name = "gretl data, through the bridge"},
    {.code = 81, .name = "compressed data, through the bridge"},
    {.code = 82, .name = "triple-s survey, through the bridge"},
};

}  // namespace ingester
