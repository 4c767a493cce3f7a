#ifndef QUORVEX_CATALOGUE_FILTER_ROW_CODEC_H
#define QUORVEX_CATALOGUE_FILTER_ROW_CODEC_H

#include "quorvex/dwb_table_filter.h"
#include "quorvex/save_meta.h"

// Package records to and from rows of the filter table. Encoding writes only the columns of
// the record given; the caller sets the row's camera, package, number and kind.
class CFilterRowCodec {
public:
    static void EncodePack(const SDwbFilterPack& pack, SFilterTable& row);
    static void DecodePack(const SFilterTable& row, SDwbFilterPack& pack);

    static void EncodeFilter(const SDwbFilter& filter, SFilterTable& row);
    static void DecodeFilter(const SFilterTable& row, SDwbFilter& filter);

    // Only the mask's own columns; the other conditions keep what the row holds.
    static void EncodeMask(const SDwbMaskArea& mask, SFilterTable& row);
    static void DecodeMask(const SFilterTable& row, SDwbMaskArea& mask);

    static void EncodeCombo(const SDwbCombo& combo, SFilterTable& row);
    static void DecodeCombo(const SFilterTable& row, SDwbCombo& combo);
};

#endif  // QUORVEX_CATALOGUE_FILTER_ROW_CODEC_H
