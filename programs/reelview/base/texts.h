// All texts that the program shows. Each is its own key in category 11 of the language file, and is shown as it is
// where the language file has no entry. Ampersands mark menu letters. One constant per line, because a test reads
// this file.
#pragma once

#include <cstdint>
#include <string>

#include "api/host_api.h"

namespace velmora::reelview::text {

inline constexpr std::int32_t kCategory = 11;

// Menus
inline constexpr char kFile[] = "&File";
inline constexpr char kOpen[] = "&Open...";
inline constexpr char kOpenSequence[] = "Open &Numbered Pictures...";
inline constexpr char kRecent[] = "Open &Recent";
inline constexpr char kSaveFrame[] = "Save &Frame...";
inline constexpr char kSaveClip[] = "Save &Clip...";
inline constexpr char kLoadPreset[] = "&Load Preset...";
inline constexpr char kSavePreset[] = "Save &Preset...";
inline constexpr char kExit[] = "E&xit";
inline constexpr char kEdit[] = "&Edit";
inline constexpr char kUndo[] = "&Undo";
inline constexpr char kRedo[] = "&Redo";
inline constexpr char kCopyFrame[] = "Copy &Frame";
inline constexpr char kCopyCommand[] = "Copy reelfx &Command";
inline constexpr char kDefaults[] = "&Default Settings";
inline constexpr char kOptions[] = "&Options...";
inline constexpr char kView[] = "&View";
inline constexpr char kAfterOnly[] = "&After";
inline constexpr char kDivider[] = "&Before and After";
inline constexpr char kSideBySide[] = "&Side by Side";
inline constexpr char kFit[] = "&Fit to Window";
inline constexpr char kFull[] = "&100 %";
inline constexpr char kDouble[] = "&200 %";
inline constexpr char kClip[] = "&Clip";
inline constexpr char kPlayOrPause[] = "&Play or Pause";
inline constexpr char kNextFrameItem[] = "&Next Frame";
inline constexpr char kPreviousFrameItem[] = "Pre&vious Frame";
inline constexpr char kFirstFrame[] = "&First Frame";
inline constexpr char kLastFrame[] = "&Last Frame";
inline constexpr char kLoopItem[] = "L&oop";
inline constexpr char kHelp[] = "&Help";
inline constexpr char kContents[] = "&Reel View Help";
inline constexpr char kEffectHelp[] = "Help on This &Effect";
inline constexpr char kAbout[] = "&About";

// Parts of the window
inline constexpr char kEffect[] = "Effect";
inline constexpr char kPresets[] = "Presets";
inline constexpr char kPicture[] = "Picture";
inline constexpr char kPosition[] = "Position";
inline constexpr char kPlay[] = "Play";
inline constexpr char kPause[] = "Pause";
inline constexpr char kNextFrame[] = "Next frame";
inline constexpr char kPreviousFrame[] = "Previous frame";
inline constexpr char kLoop[] = "Loop";
inline constexpr char kBefore[] = "Before";
inline constexpr char kAfter[] = "After";
inline constexpr char kFrame[] = "Frame";
inline constexpr char kFramesPerSecond[] = "frames/s";
inline constexpr char kMilliseconds[] = "ms per frame";
inline constexpr char kInvitation[] = "Drop a film or a picture here, or press Ctrl+O.";
inline constexpr char kSaving[] = "Saving";
inline constexpr char kSaved[] = "Saved";
inline constexpr char kCopied[] = "Copied";
inline constexpr char kNotNumbered[] =
    "reelfx accepts several pictures only if they are numbered without gaps.";
inline constexpr char kCancel[] = "Cancel";

// File types
inline constexpr char kAllKinds[] = "Films and pictures";
inline constexpr char kAllFiles[] = "All files";
inline constexpr char kPngPicture[] = "PNG picture";
inline constexpr char kAviPlain[] = "AVI film, uncompressed";
inline constexpr char kAviCodec[] = "AVI film, choose a codec";
inline constexpr char kPngSequence[] = "PNG pictures, numbered";
inline constexpr char kY4mFilm[] = "YUV4MPEG2 film";

// Errors
inline constexpr char kCannotOpen[] = "The file cannot be opened.";
inline constexpr char kCannotRead[] = "The file is damaged, or this system does not know its format.";
inline constexpr char kNoFrames[] = "The file contains no pictures.";
inline constexpr char kTooLarge[] = "The picture is too large.";
inline constexpr char kCannotReadFrame[] = "This frame cannot be read.";
inline constexpr char kOtherSize[] = "The pictures are not all the same size.";
inline constexpr char kNoDecoder[] = "This system has no decoder for this film.";
inline constexpr char kNoMemory[] = "There is not enough memory.";
inline constexpr char kCannotWrite[] = "The file cannot be written.";
inline constexpr char kFilesExist[] = "Files with these names already exist. Choose another name.";
inline constexpr char kAviTooLarge[] = "An AVI file can hold at most 2 GB. Choose another file type.";
inline constexpr char kCodecRefuses[] = "The codec does not accept this film.";
inline constexpr char kLibraryFailed[] = "The effect library failed. Start the program again.";
inline constexpr char kEffectRefuses[] = "The effect cannot render this frame.";
inline constexpr char kLibrarySilent[] = "The effect library does not answer.";

}  // namespace velmora::reelview::text

namespace velmora::reelview {

// The texts in the user's language, from the library's language file. Windows only (texts_win32.cpp); window's thread only.
class Texts {
  public:
    // `library` may be null and must outlive the texts. `language` is a two-letter code.
    Texts(IEffectLibrary* library, std::string language);

    [[nodiscard]] const std::string& Language() const { return m_language; }
    // The text for one of the keys; the English one when there is no translation.
    [[nodiscard]] std::wstring operator()(const char* key) const;
    // Without the ampersand of the menu letter.
    [[nodiscard]] std::wstring Plain(const char* key) const;

  private:
    IEffectLibrary* m_library;
    std::string m_language;
};

// The two-letter code of the user's interface language.
[[nodiscard]] std::string SystemLanguage();

// The library's texts are in the system's code page.
[[nodiscard]] std::wstring WideOf(const std::string& text);
[[nodiscard]] std::string Utf8Of(const std::wstring& text);

}  // namespace velmora::reelview
