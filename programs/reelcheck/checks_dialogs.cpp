// Presets on disk, options and help: what the library does with dialogs.

#include <algorithm>
#include <cstring>
#include <filesystem>
#include <random>
#include <string>

#include "programs/reelcheck/checks.h"
#include "programs/reelcheck/dialog_answers.h"
#include "programs/reelcheck/fail_each.h"
#include "programs/reelcheck/library.h"
#include "programs/reelcheck/playing_host.h"

namespace velmora::reelcheck {
namespace {

// A folder for this process's files; removed with its contents.
class WorkFolder {
  public:
    WorkFolder() {
        const std::filesystem::path base = std::filesystem::temp_directory_path();
        std::random_device random;
        std::filesystem::path folder;
        do {
            folder = base / ("reelcheck-" + std::to_string(random()));
        } while (!std::filesystem::create_directory(folder));
        m_folder = folder.string();
    }
    ~WorkFolder() {
        std::error_code ignored;
        std::filesystem::remove_all(m_folder, ignored);
    }
    WorkFolder(const WorkFolder&) = delete;
    WorkFolder& operator=(const WorkFolder&) = delete;

    [[nodiscard]] std::string PathOf(const char* name) const { return m_folder + "/" + name; }

  private:
    std::string m_folder;
};

// The system's XML library on native systems can leak the tree that it is reading; the product has its own, fixed XML
// code.
std::uint64_t LostByParser() noexcept {
    return IsModule() ? 0 : 1000;
}

enum SaverResult : std::int32_t { kDone = 0, kFailed = 1, kOtherEffect = 2 };

constexpr const char* kLanguages[] = {nullptr, "en", "de", "??", "longer"};

PresetRecord RecordOf(IVideoEffect& effect, const EffectFacts& facts, std::uint32_t preset) {
    PresetRecord record = {};
    std::strncpy(record.name, facts.presets[preset].c_str(), sizeof record.name - 1);
    PresetCell cell = {};
    for (std::uint32_t i = 0; effect.GetPresetValue(preset, i, &cell); ++i) {
        record.values[i] = {cell.value, 0, facts.params[i].kind};
        ++record.count;
    }
    return record;
}

bool SameValue(const ValueCell& a, const ValueCell& b) noexcept {
    if (a.kind != b.kind) return false;
    switch (a.kind) {
        case kKindSlider:
            return a.value.number == b.value.number;
        case kKindCheckBox:
            return a.value.flag == b.value.flag;
        case kKindMenu:
        case kKindColour:
            return a.value.bits == b.value.bits;
        default:
            return true;  // a marker has no value
    }
}

bool SameSettings(const PresetRecord& a, const PresetRecord& b) noexcept {
    return a.count == b.count && std::strcmp(a.name, b.name) == 0 &&
           std::equal(a.values, a.values + a.count, b.values, SameValue);
}

struct Desk {
    OpenLibrary library;
    Reference<IPresetSaver> saver;
    WorkFolder folder;

    explicit Desk(const CheckContext& context) : library(context.libraryPath), saver(library.Saver()) {}

    // Tries to save or load with the dialog answered by `path`. Fails unless the result is `expected` and the user is
    // told of a failure exactly once.
    void Save(const char* path, std::uint32_t effect, PresetRecord* record, std::int32_t expected,
              const char* language = nullptr) const {
        const DialogAnswers answers(path);
        Judge(answers, saver->SavePreset(nullptr, library.Get(), effect, record, language), expected);
    }
    void Load(const char* path, std::uint32_t effect, PresetRecord* record, std::int32_t expected,
              const char* language = nullptr) const {
        const DialogAnswers answers(path);
        Judge(answers, saver->LoadPreset(nullptr, library.Get(), effect, record, language), expected);
    }

  private:
    static void Judge(const DialogAnswers& answers, std::int32_t result, std::int32_t expected) {
        if (result != expected) Fail(Text("result %d instead of %d", result, expected));
        Require(answers.Messages() == (expected == kDone ? 0 : 1), "another message is shown");
    }
};

}  // namespace

void CheckPresetFiles(CheckContext& context) {
    const Desk desk(context);
    for (std::uint32_t index = 0; index < kEffectCount; ++index) {
        const Reference<IVideoEffect> effect = desk.library.Effect(index);
        const EffectFacts facts = EffectFacts::Of(*effect);
        const std::string file = desk.folder.PathOf("one.preset");
        const char* const path = file.c_str();
        PresetRecord read = {};
        for (std::uint32_t preset = 0; preset < facts.presets.size(); ++preset) {
            SetPlace("%s, %s", facts.name.c_str(), facts.presets[preset].c_str());
            PresetRecord record = RecordOf(*effect, facts, preset);
            const char* const language = kLanguages[preset % std::size(kLanguages)];
            desk.Save(path, index, &record, kDone, language);
            read = {};
            desk.Load(path, index, &read, kDone, language);
            Require(SameSettings(read, record), "comes back from its file as another one");
        }
        SetPlace("%s, another effect's file", facts.name.c_str());
        desk.Load(path, (index + 1) % kEffectCount, &read, kOtherEffect);
        SetPlace("%s, cancelled", facts.name.c_str());
        desk.Save(nullptr, index, &read, kDone);
        desk.Load(nullptr, index, &read, kDone);
        SetPlace("%s, no record", facts.name.c_str());
        desk.Save(path, index, nullptr, kFailed);
        desk.Load(path, index, nullptr, kFailed);
        SetPlace("%s, no such folder", facts.name.c_str());
        const std::string missing = desk.folder.PathOf("none/one.preset");
        const char* const nowhere = missing.c_str();
        desk.Save(nowhere, index, &read, kFailed);
        desk.Load(nowhere, index, &read, kFailed);
        SetPlace("%s, an effect that does not exist", facts.name.c_str());
        read.count = 3;
        desk.Save(desk.folder.PathOf("two.preset").c_str(), 77, &read, kDone);
    }
    SetPlace("hostile record");
    for (const std::int32_t count : {-1, 101, 0x7FFFFFFF, -0x7FFFFFFF - 1}) {
        PresetRecord record;
        std::memset(&record, 0xEE, sizeof record);  // unterminated names, values of no kind
        record.count = count;
        const std::string file = desk.folder.PathOf("hostile.preset");
        const DialogAnswers answers(file.c_str());
        desk.saver->SavePreset(nullptr, nullptr, 0, &record, "de");
        desk.saver->LoadPreset(nullptr, nullptr, 0, &record, "de");
        Require(record.count <= kPresetCellCapacity || record.count == count,
                "a count past the record's end");
    }
}

// A failed save reports it and leaves the existing preset as it was; a failed load reports it.
void CheckPresetFailures(CheckContext& context) {
    const Desk desk(context);
    const auto most = static_cast<std::uint64_t>(context.Rounds(150, 100000));
    const std::uint32_t index = kEffectCount - 1;
    const Reference<IVideoEffect> effect = desk.library.Effect(index);
    const EffectFacts facts = EffectFacts::Of(*effect);
    PresetRecord old = RecordOf(*effect, facts, 1), fresh = RecordOf(*effect, facts, 2), read = {};
    const std::string file = desk.folder.PathOf("one.preset");
    const char* const path = file.c_str();
    for (const char* language : {static_cast<const char*>(nullptr), "de"}) {
        const auto run = [&](bool isSaving, PresetRecord& record, std::uint64_t failing) {
            const DialogAnswers answers(path);
            std::uint64_t count = 0;
            std::int32_t result = 0;
            {
                const AllocationWatch watch(failing);
                result = isSaving
                             ? desk.saver->SavePreset(nullptr, desk.library.Get(), index, &record, language)
                             : desk.saver->LoadPreset(nullptr, desk.library.Get(), index, &record, language);
                count = watch.Count();
            }
            Require(result == kDone || (failing != 0 && (result == kFailed || result == kOtherEffect)),
                    "another result");
            Require((answers.Messages() != 0) == (result != kDone), "another message is shown");
            return std::pair(count, result);
        };
        FailEach(
            context, language == nullptr ? "save" : "save, translated", most, 0, [&](std::uint64_t failing) {
                desk.Save(path, index, &old, kDone);
                const auto [count, result] = run(true, fresh, failing);
                desk.Load(path, index, &read, kDone);
                Require(SameSettings(read, result == kDone ? fresh : old), "the file holds something else");
                return count;
            });
        desk.Save(path, index, &fresh, kDone);
        FailEach(context, language == nullptr ? "load" : "load, translated", most, LostByParser(),
                 [&](std::uint64_t failing) {
                     read = {};
                     const auto [count, result] = run(false, read, failing);
                     Require(result != kDone || SameSettings(read, fresh), "another preset is read");
                     return count;
                 });
    }
    const auto files = std::filesystem::directory_iterator(std::filesystem::path(path).parent_path());
    SetPlace("saving");
    Require(std::distance(files, {}) == 1, "other files are left behind");
}

void CheckDialogFailures(CheckContext& context) {
    const OpenLibrary library(context.libraryPath);
    IShellServices* const services = library->GetShellServices();
    const auto most = static_cast<std::uint64_t>(context.Rounds(60, 100000));
    const auto tryDialog = [&](const char* name, auto show) {
        FailEach(context, name, most, 0, [&](std::uint64_t failing) {
            const DialogAnswers answers(nullptr);
            const DialogCanceller canceller;
            std::uint64_t count = 0;
            std::int32_t result = 0;
            {
                const AllocationWatch watch(failing);
                result = show();
                count = watch.Count();
            }
            Require(result == 0 || result == answers.Programs(), "another result");
            if (failing == 0 && IsModule())
                Require(canceller.Cancelled() + answers.Programs() > 0, "shows nothing");
            return count;
        });
    };
    tryDialog("help", [&] { return library->ShowHelp(nullptr, 100) != 0 ? 1 : 0; });
    tryDialog("options", [&] { return services->ShowOptions(nullptr); });
}

// Uses the system's own dialogs, which really appear.
void CheckSystemDialogs(CheckContext& context) {
    if (!IsModule()) return;
    const Desk desk(context);
    PresetRecord record = {};
    for (int round = 0; round < context.Rounds(1, 2); ++round) {
        for (const char* language : kLanguages) {
            SetPlace("round %d, language %s", round, language != nullptr ? language : "none");
            const DialogCanceller canceller;
            Require(desk.saver->SavePreset(nullptr, desk.library.Get(), 0, &record, language) == kDone,
                    "saving does not end as cancelled");
            Require(desk.saver->LoadPreset(nullptr, desk.library.Get(), 0, &record, language) == kDone,
                    "loading does not end as cancelled");
            Require(desk.saver->LoadPreset(nullptr, desk.library.Get(), 0, nullptr, language) == kFailed,
                    "loading without a record does not fail");
            Require(desk.library->GetShellServices()->ShowOptions(nullptr) == 0,
                    "options do not end as cancelled");
            Require(canceller.Cancelled() >= 4, "a dialog did not appear");
        }
    }
}

}  // namespace velmora::reelcheck
