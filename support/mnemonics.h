// The letters that, pressed together with Alt, reach a control of a dialog. Translated texts come without
// them, and translators could not know which letters the other texts of a dialog take.
#pragma once

#include <string>
#include <string_view>

namespace velmora::support {

// Gives the texts of one dialog their letters, in the order of the calls.
class MnemonicChooser {
  public:
    // The text with "&" before its first Latin, Greek or Cyrillic letter that no earlier text took. A text without
    // such a letter gets "(&X)" at its end, as is the custom where letters are not typed directly; X is
    // `substitute`, a capital Latin letter. A text with "&" already keeps it; "&&" in it stands for the sign itself.
    // An empty text stays empty.
    std::u16string Mark(std::u16string_view text, char16_t substitute);

  private:
    bool Take(char16_t letter);

    std::u16string m_taken;  // capital letters
};

}  // namespace velmora::support
