#ifndef QUORVEX_CATALOGUE_SETTING_TEXT_CODEC_H
#define QUORVEX_CATALOGUE_SETTING_TEXT_CODEC_H

#include <string>

#include "quorvex/amf_settings.h"

// The two settings values that the filter table keeps as text: the three speed-limit switches
// of a filter ("EnableDvxy") and the chain of a combination filter ("CombiInfo").
class CSettingTextCodec {
public:
    // "1 & 0 & 1" for (true, false, true).
    static std::string EncodeEnableDvxy(bool dx, bool dy, bool dv);
    // Reads three numbers; a switch whose number cannot be read is off. Returns whether all
    // three were read.
    static bool DecodeEnableDvxy(const std::string& text, bool& dx, bool& dy, bool& dv);

    // Filter numbers, logic values and intervals in that order, joined by " & ".
    static std::string EncodeCombiInfo(const SDwbAmfComboFilter& combo);
    // Reads the seven numbers back into combo (the sparse-alert interval is left alone). A value
    // that cannot be read leaves its field as an unused slot (filter numbers) or 0. Returns
    // whether all seven were read.
    static bool DecodeCombiInfo(const std::string& text, SDwbAmfComboFilter& combo);
};

#endif  // QUORVEX_CATALOGUE_SETTING_TEXT_CODEC_H
