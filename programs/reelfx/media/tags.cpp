#include "programs/reelfx/media/container.h"

#include <algorithm>
#include <cstdlib>
#include <limits>
#include <string>

#include "text/names.h"

extern "C" {
#include <libavutil/timecode.h>
}

namespace velmora::hosts {
namespace {

constexpr const char* kOfFile[] = {"encoder", "major_brand", "minor_version", "compatible_brands"};
constexpr const char* kOfEncoding[] = {"encoder",          "vendor_id", "rotate",          "alpha_mode",
                                       "NUMBER_OF_FRAMES", "DURATION",  "NUMBER_OF_BYTES", "BPS"};

template <std::size_t count>
bool IsOneOf(const std::string& key, const char* const (&names)[count]) {
    return std::ranges::any_of(names, [&](const char* name) {
        // Matroska adds the language: "BPS-eng".
        return IsSameButForCase(key.substr(0, key.find('-')), name);
    });
}

void CopyTags(AVDictionary* from, AVDictionary*& to, auto isStale) {
    const AVDictionaryEntry* entry = nullptr;
    while ((entry = av_dict_get(from, "", entry, AV_DICT_IGNORE_SUFFIX))) {
        if (!isStale(std::string(entry->key))) av_dict_set(&to, entry->key, entry->value, 0);
    }
}

}  // namespace

void CopyContainerTags(const AVFormatContext& from, AVFormatContext& to) {
    CopyTags(from.metadata, to.metadata, [](const std::string& key) { return IsOneOf(key, kOfFile); });
}

void CopyStreamTags(const AVStream& from, AVStream& to, bool isEncodedAnew) {
    CopyTags(from.metadata, to.metadata, [&](const std::string& key) {
        return isEncodedAnew && (IsOneOf(key, kOfEncoding) || key.starts_with("_STATISTICS_"));
    });
}

void CopyChapters(const AVFormatContext& from, const TagSpan& span, AVFormatContext& to) {
    if (from.nb_chapters == 0) return;
    auto** chapters = static_cast<AVChapter**>(av_calloc(from.nb_chapters, sizeof(AVChapter*)));
    if (!chapters) throw std::bad_alloc();
    to.chapters = chapters;
    for (unsigned i = 0; i < from.nb_chapters; ++i) {
        const AVChapter& source = *from.chapters[i];
        const double tick = av_q2d(source.time_base);
        const double start = static_cast<double>(source.start) * tick,
                     end = static_cast<double>(source.end) * tick;
        if (end <= span.begin || (span.end && start >= *span.end)) continue;
        auto* chapter = static_cast<AVChapter*>(av_mallocz(sizeof(AVChapter)));
        if (!chapter) throw std::bad_alloc();
        to.chapters[to.nb_chapters++] = chapter;
        chapter->id = source.id;
        chapter->time_base = source.time_base;
        chapter->start = static_cast<std::int64_t>((std::max(start, span.begin) - span.origin) / tick + 0.5);
        chapter->end = static_cast<std::int64_t>(
            ((span.end ? std::min(end, *span.end) : end) - span.origin) / tick + 0.5);
        av_dict_copy(&chapter->metadata, source.metadata, 0);
    }
}

void MoveTimecode(AVDictionary*& tags, AVRational rate, std::int64_t frames) {
    const AVDictionaryEntry* entry = av_dict_get(tags, "timecode", nullptr, 0);
    AVTimecode timecode = {};
    if (!entry || av_timecode_init_from_string(&timecode, rate, entry->value, nullptr) < 0) return;
    char text[AV_TIMECODE_STR_SIZE];
    const auto number = static_cast<int>(std::min<std::int64_t>(frames, std::numeric_limits<int>::max()));
    av_dict_set(&tags, "timecode", av_timecode_make_string(&timecode, text, number), 0);
}

}  // namespace velmora::hosts
