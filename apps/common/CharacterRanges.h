#pragma once

namespace apps {

/// Whether a terminal draws `character` over or into the one before it: combining marks, format controls, and the
/// medial and final letters of Korean syllables. The Unicode Standard, general categories Mn, Me and Cf.
bool isZeroWidth(char32_t character);

/// Whether a terminal gives `character` two columns: Wide or Fullwidth in Unicode Standard Annex 11. Ambiguous ones
/// have one.
bool isWide(char32_t character);

} // namespace apps
