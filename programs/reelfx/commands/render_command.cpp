#include "programs/reelfx/commands/commands.h"

#include <cmath>
#include <cstdio>
#include <thread>

#include "programs/common/digest.h"
#include "text/number_text.h"
#include "programs/reelfx/pipeline/frame_worker.h"
#include "programs/reelfx/common/failure.h"
#include "programs/reelfx/pictures/pictures.h"
#include "programs/reelfx/common/output_place.h"
#include "programs/reelfx/media/bgra_picture.h"
#include "programs/reelfx/media/media_facts.h"
#include "programs/reelfx/media/media_writer.h"
#include "programs/reelfx/pipeline/effect_list.h"

namespace velmora::hosts {
namespace {

std::string Line(std::string name, const std::string& text) {
    name.resize(10, ' ');
    return name + text + '\n';
}

std::string SectionText(const SectionOptions& options, std::int64_t frames) {
    if (options.IsWholeClip()) return "the whole clip";
    std::string text;
    if (options.start || options.duration) {
        text = "from " + NumberText(options.start.value_or(0.0)) + " s";
        if (options.duration) text += " for " + NumberText(*options.duration) + " s";
    } else {
        text = "from frame " + std::to_string(options.firstFrame);
        if (options.endFrame) text += " up to but not including " + std::to_string(*options.endFrame);
    }
    return frames > 0 ? text + " (" + std::to_string(frames) + " frames)" : text;
}

std::string SettingsText(const EffectChoice& choice) {
    std::string text;
    for (std::uint32_t i = 0; i < choice.Info().params.size(); ++i) {
        const ParamInfo& param = choice.Info().params[i];
        if (!param.HoldsValue()) continue;
        text += (text.empty() ? "" : ", ") + param.name + "=" + choice.ShownSetting(i);
    }
    return text;
}

std::string RandomText(const EffectOptions& options) {
    if (options.randomState) return "continuous sequence from state " + HexText(*options.randomState);
    return "seed " + std::to_string(options.seed);
}

std::string EffectText(const EffectChoice& choice) {
    std::string effect = choice.Info().name;
    if (choice.Preset()) effect += ", preset " + choice.Info().presets[*choice.Preset()];
    if (choice.Options().presetFile) effect += ", preset file " + *choice.Options().presetFile;
    if (choice.MixText() != "100") effect += ", mix " + choice.MixText();
    return Line("effect", effect) + Line("settings", SettingsText(choice)) +
           Line("random", RandomText(choice.Options()));
}

// What the effects work on.
SampleType SamplesOf(const RenderOptions& options, const MediaReader& reader) {
    // The matte is read from what damage does to bytes.
    if (options.isMatte) return SampleType::kBytes;
    return options.depth.value_or(SamplesFor(FactsOf(reader)));
}

// What `reelfx render --dry-run` prints: everything that a run would do, as lines of text with line ends. `section` has the
// farm part resolved. A null `writer` means digests only.
std::string PlanText(const RenderOptions& options, const SectionOptions& section, const EffectList& effects,
                     const MediaReader& reader, const MediaWriter* writer, unsigned threads) {
    const MediaFacts facts = FactsOf(reader);
    std::string text = Line("input", reader.Name() + ": " + ShortText(facts));
    for (const std::string& note : NotesOn(facts)) text += Line("note", note);
    text += Line("part", SectionText(section, ClipSection::FrameCountGuess(reader, section)));
    for (const EffectChoice& choice : effects.Choices()) text += EffectText(choice);
    if (options.isMatte) text += Line("matte", "only the damage, with straight alpha");
    text += Line("depth", DepthText(SamplesOf(options, reader)));
    text += Line("threads", std::to_string(threads));
    text += Line("output", writer ? writer->Description() : "digests on standard output");
    for (const std::string& note : writer ? writer->Notes() : std::vector<std::string>())
        text += Line("note", note);
    return text;
}

class RenderRun {
  public:
    explicit RenderRun(const RenderOptions& options)
        : m_options(options),
          m_effects(options.effects),
          m_section(options.section.farm
                        ? ResolveFarm(*options.section.farm, MediaReader::TimesOf(options.input))
                        : options.section),
          m_reader(options.input) {
        ResolveStart(options.input, m_reader, m_section);
        if (options.isMatte) CheckMatte(m_effects.Choices());
        if (!options.output) return;
        const std::int64_t firstImage = FirstImage();
        CheckIsNotInput(options.output->path, options.input.path, firstImage);
        if (options.isDryRun) {
            CheckOutputPlace(options.output->path, options.mayOverwrite, firstImage);
        } else {
            m_place.emplace(options.output->path, options.mayOverwrite, firstImage);
        }
        const std::string address = m_place ? m_place->Address() : options.output->path;
        m_writer.emplace(*options.output, address, m_reader, options.withSound);
        if (firstImage > 1) m_writer->NumberImagesFrom(firstImage);
    }

    // Does everything except the frames.
    ExitCode Rehearse() {
        const std::int64_t frames = ClipSection::FrameCountGuess(m_reader, m_section);
        if (frames == 0 && m_reader.FrameCountGuess() > 0) FailEmpty();
        if (m_writer) m_writer->Rehearse(frames);
        const std::string text = PlanText(m_options, m_section, m_effects, m_reader,
                                          m_writer ? &*m_writer : nullptr, ThreadCount());
        std::fputs(text.c_str(), stdout);
        return kExitDone;
    }

    ExitCode Run() {
        const std::int64_t frames = ClipSection::FrameCountGuess(m_reader, m_section);
        if (m_writer) {
            m_writer->CheckFrameCount(frames);
            m_writer->Begin();
            Report(m_writer->Notes());
        }
        Progress progress(frames, m_options.progress);
        RenderAll(progress);
        if (Interrupts() > 0) FinishPart("interrupted", kExitInterrupted);
        if (!m_reader.BreakOff().empty())
            FinishPart(m_reader.Name() + ": " + m_reader.BreakOff(), kExitInput);
        if (m_frames == 0) FailEmpty();
        ReportDamage();
        if (m_writer) {
            m_writer->Finish(m_endSeconds);
            m_place->Keep();
        }
        progress.End();
        ReportLateNotes();
        return kExitDone;
    }

  private:
    void RenderAll(Progress& progress) {
        ClipSection section(m_reader, m_section);
        BatchStep batch;
        if (m_options.withDigests) {
            // Results for the writer take memory as well.
            batch = {[&](std::span<PipelineItem* const> items) { m_digests.Compute(items); },
                     m_writer ? FrameDigests::kBatch - 1 : FrameDigests::kBatch};
        }
        FramePipeline pipeline([&] { return section.Next(); }, MakeWorkers(), std::move(batch));
        while (const PipelineItemPtr item = pipeline.Next()) {
            if (Interrupts() > 1) throw Failure(kExitInterrupted, "interrupted; nothing was kept");
            Write(*item);
            if (!item->packet) progress.Update(++m_frames);
        }
        m_endSeconds = section.EndSeconds();
    }

    // Images have the numbers of their frames, plus 1. Parts of a farm share a folder: each continues where the previous
    // one ends, counting the frames that a constant rate repeats.
    [[nodiscard]] std::int64_t FirstImage() const {
        if (!m_options.section.farm) return m_section.firstFrame + 1;
        const std::optional<FrameRate> fps = m_options.output->fps;
        FrameClock clock(fps ? AVRational{fps->numerator, fps->denominator} : m_reader.FrameRateGuess(),
                         true);
        std::int64_t images = 0;
        for (std::int64_t i = 0; i <= m_section.firstFrame; ++i) {
            const std::int64_t pts = m_section.frameTimes.pts[static_cast<std::size_t>(i)];
            // Frames of a raw stream have no times; they follow at its rate.
            const double seconds = pts == AV_NOPTS_VALUE
                                       ? static_cast<double>(i) / av_q2d(m_reader.FrameRateGuess())
                                       : m_reader.SecondsOf(pts);
            const FrameClock::Step step = clock.Take(seconds);
            for (std::int64_t written = step.repeats + (step.isLeftOut ? 0 : 1); written > 0; --written)
                images = clock.TakePlace() + 1;
        }
        return images;
    }

    // What is left out or changed on purpose, in one line.
    void Report(const std::vector<std::string>& notes) const {
        std::string text;
        for (const std::string& note : notes) text += (text.empty() ? "" : "; ") + note;
        if (!text.empty()) std::fprintf(stderr, "reelfx: %s: %s\n", m_place->Name().c_str(), text.c_str());
    }

    void ReportLateNotes() const {
        std::vector<std::string> notes;
        if (m_writer) notes = m_writer->LateNotes();
        if (m_writer && !m_reader.OtherSize().empty()) {
            notes.push_back("the source changes to " + m_reader.OtherSize() +
                            ", and those frames are scaled to the first one's size");
        }
        Report(notes);
    }

    [[nodiscard]] MediaWriter::Section SectionAt(const PipelineItem& first) const {
        MediaWriter::Section section = {.pts = first.frame->pts, .index = first.index, .endSeconds = {}};
        const double rate = av_q2d(m_reader.FrameRateGuess());
        if (m_section.duration) section.endSeconds = m_section.start.value_or(0.0) + *m_section.duration;
        if (m_section.endFrame) {
            const auto end = static_cast<std::size_t>(*m_section.endFrame);
            const auto& times = m_section.frameTimes.pts;
            section.endSeconds =
                end < times.size() ? m_reader.SecondsOf(times[end]) : static_cast<double>(end) / rate;
        }
        return section;
    }

    [[nodiscard]] unsigned ThreadCount() const {
        // A continuous random sequence needs the frames in order.
        if (m_effects.IsSequence()) return 1;
        // A worker without a processor of its own speeds nothing up and holds two pictures.
        const unsigned processors = std::max(1u, std::thread::hardware_concurrency());
        return m_options.threads > 0 ? std::min(static_cast<unsigned>(m_options.threads), processors)
                                     : processors;
    }

    std::vector<FramePipeline::Worker> MakeWorkers() {
        const unsigned count = ThreadCount();
        const AVFrame& first = m_reader.FirstFrame();
        const FrameWorker::Job job = {.writer = m_writer ? &*m_writer : nullptr,
                                      .size = {first.width, first.height},
                                      .turn = m_reader.Turn(),
                                      .digests = m_options.withDigests ? &m_digests : nullptr,
                                      .samples = SamplesOf(m_options, m_reader),
                                      .isMatte = m_options.isMatte};
        std::vector<FramePipeline::Worker> workers;
        for (unsigned i = 0; i < count; ++i) {
            auto worker = std::make_shared<FrameWorker>(m_effects.NewSession(), job);
            workers.emplace_back([worker](PipelineItem& item) { worker->Work(item); });
        }
        return workers;
    }

    void Write(PipelineItem& item) {
        if (item.packet) {
            if (m_writer) m_writer->WritePacket(*item.packet);
            return;
        }
        if (m_options.withDigests && std::printf("%s\n", DigestLine(item.index, item.digest).c_str()) < 0) {
            throw Failure(kExitOutput, "standard output cannot be written");
        }
        if (!m_writer) return;
        if (m_frames == 0 && !m_section.IsWholeClip()) m_writer->StartAt(SectionAt(item));
        m_writer->WriteFrame(std::move(item.frame));
    }

    // One line that says what is wrong with the clip.
    void ReportDamage() const {
        const double missing = m_reader.MissingSeconds();
        std::string what;
        if (m_reader.DamagedPackets() > 0) {
            what = "damaged in " + std::to_string(m_reader.DamagedPackets()) + " places";
        }
        if (missing > 0.0) what += (what.empty() ? "ends " : ", ends ") + NumberText(missing) + " s early";
        const std::string image = m_reader.MissingImage();
        if (!image.empty()) {
            what += (what.empty() ? "" : ", ") + image + " is missing and the images after it are left out";
        }
        if (what.empty()) return;
        std::fprintf(stderr, "reelfx: %s: %s; the part that could be decoded was rendered\n",
                     m_reader.Name().c_str(), what.c_str());
    }

    // A complete older file is worth more than part of a new one.
    [[noreturn]] void FinishPart(const std::string& why, ExitCode code) {
        if (!m_writer || m_frames == 0 || m_place->ReplacesFile()) {
            throw Failure(code, why + "; nothing was written");
        }
        m_writer->Finish(m_endSeconds);
        m_place->Keep();
        throw Failure(code, why + "; " + m_place->Name() + " contains the first " + std::to_string(m_frames) +
                                " frames");
    }

    [[noreturn]] void FailEmpty() const {
        throw Failure(kExitInput, m_reader.Name() + ": no frame in the requested part; the clip has " +
                                      std::to_string(m_reader.FrameCountGuess()) + " frames");
    }

    const RenderOptions& m_options;
    EffectList m_effects;
    SectionOptions m_section;
    MediaReader m_reader;
    std::optional<OutputPlace> m_place;
    std::optional<MediaWriter> m_writer;
    std::optional<double> m_endSeconds;  // of the section
    FrameDigests m_digests;
    std::int64_t m_frames = 0;
};

}  // namespace

ExitCode Run(const RenderOptions& options) {
    RenderRun run(options);
    return options.isDryRun ? run.Rehearse() : run.Run();
}

}  // namespace velmora::hosts
