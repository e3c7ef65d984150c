// The rows of science: microarrays, genetics, maps, surveys, ecology, pictures and sound.
#pragma once

#include "interface/file_detection.h"
#include "interface/formats/format_driver.h"

namespace ingester {

constexpr Format_Driver Science_Formats[] = {
    {.code = 17, .name = "field records"},
    {.code = 26, .name = "Shapefile"},
    {.code = 27, .name = "MapInfo interchange"},
    {.code = 32, .name = "Windows bitmap", .extensions = ".bmp"},
    {.code = 33, .name = "WAVE sound"},
    {.code = 49, .name = "NMR phase file"},
    {.code = 50, .name = "Affymetrix CEL, binary"},
    {.code = 51, .name = "Affymetrix CDF, binary"},
    {.code = 52, .name = "Affymetrix CHP, binary"},
    {.code = 53, .name = "Affymetrix CEL, text"},
    {.code = 54, .name = "Affymetrix CDF, text"},
    {.code = 55, .name = "GeneChip sequences"},
    {.code = 60, .name = "JPEG image", .extensions = ".jpg"},
    {.code = 61, .name = "TIFF image", .extensions = ".tif .tiff"},
    {.code = 62, .name = "GIF image", .extensions = ".gif"},
    {.code = 63, .name = "PNG image", .extensions = ".png"},
    {.code = 64, .name = "PSD image", .extensions = ".psd"},
    {.code = 65, .name = "Windows metafile", .extensions = ".emf"},
    {.code = 66, .name = "other images"},
    {.code = 69, .name = "Affymetrix generic CEL"},
    {.code = 70, .name = "Affymetrix generic CHP"},
    {.code = 72, .name = "Cornell Ecology", .extensions = ".cep"},
    {.code = qtl_locus_file, .name = "QTL locus file"},
    {.code = 74, .name = "QTL quantitative data"},
    {.code = 75, .name = "CSPro dictionary"},
};

}  // namespace ingester
