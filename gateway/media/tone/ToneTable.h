#pragma once

#include "media/tone/Tone.h"
#include "platform/media/MG_Tones.h"

#include <map>
#include <string>

/// The tones of a country.
///
/// They are written in TOML, a table for each country with a key for each tone, named as in MG_Tones with small letters
/// and hyphens; its pieces in the order of sounding, those before "..." only once, and without any "..." after the last
/// from the first again:
///
///     [de]
///     busy = ["425/480", "0/480"]
///     special-information = ["950/330", "1400/330", "1800/330", "0/1000"]
///     confirmation = ["425/100", "0/100", "425/100", "..."]  # ends
class ToneTable
{
public:
    /// Those of ten countries, as ITU-T E.180 supplement 2 has them.
    static std::string_view BUILT_IN();
    /// Reads a country of a text as above: false, with a reason in `error`, when the text is malformed or has no such
    /// country. Leaves the table unchanged then.
    bool read(std::string_view text, std::string const& country, std::string& error);

    /// Null when the country has no such tone. It stays as long as the table.
    Tone const* find(MG_Tones::ECallProgressTone::Type tone) const;

private:
    std::map<MG_Tones::ECallProgressTone::Type, Tone> m_tones;
};
