// Runs frames through several workers at once and returns them in their original order. A worker's result
// must depend only on the frame; then it does not depend on the number of workers.
#pragma once

#include <condition_variable>
#include <cstdint>
#include <deque>
#include <exception>
#include <functional>
#include <memory>
#include <mutex>
#include <span>
#include <string>
#include <thread>
#include <vector>

#include "programs/reelfx/media/av_handles.h"
#include "programs/reelfx/media/bgra_picture.h"

namespace velmora::hosts {

// A frame in the pipeline, or a packet of another stream that keeps its place between the frames.
struct PipelineItem {
    FramePtr frame;          // the source; the worker replaces it with the result
    PacketPtr packet;        // set: there is nothing to work on
    std::int64_t index = 0;  // of the frame in the clip
    double seconds = 0.0;    // since the clip's first frame
    BgraPicture picture;     // the result, while its digest waits for others; see FrameDigests
    std::string digest;      // if requested
};
using PipelineItemPtr = std::unique_ptr<PipelineItem>;

// A second step on items, for which `most` of them wait for each other; fewer at the end, and when no other work is left
// until they are through. It is done by the workers, so several threads call it.
struct BatchStep {
    std::function<void(std::span<PipelineItem* const>)> work = {};
    std::size_t most = 1;
};

class FramePipeline {
  public:
    using Source = std::function<PipelineItemPtr()>;    // null at the end; called from one thread
    using Worker = std::function<void(PipelineItem&)>;  // each is called from one thread

    FramePipeline(Source source, std::vector<Worker> workers, BatchStep batch = {});
    ~FramePipeline();  // stops at the next frame
    FramePipeline(const FramePipeline&) = delete;
    FramePipeline& operator=(const FramePipeline&) = delete;

    // The next finished item; null after the last. Rethrows what the source or a worker threw, at the item's
    // turn.
    PipelineItemPtr Next();

  private:
    enum class Stage { kWaiting, kInWork, kWorked, kInBatch, kDone };
    struct Slot {
        PipelineItemPtr item;
        Stage stage = Stage::kWaiting;
        std::exception_ptr error;
    };

    void Start(Source source, std::vector<Worker>& workers);
    void Stop();
    void Fill(const Source& source);
    void Work(const Worker& worker);
    static void WorkOn(Slot& slot, const Worker& worker);
    void WorkOn(const std::vector<Slot*>& slots) const;
    [[nodiscard]] std::vector<Slot*> NextBatch() const;
    [[nodiscard]] bool Has(Stage stage) const;
    [[nodiscard]] bool IsFull() const;
    [[nodiscard]] bool IsFrontDone() const;
    void WakeAll();
    [[nodiscard]] Slot* FirstWaiting() const;

    std::mutex m_mutex;
    // One for each kind of thread: a thread that is woken in vain takes a processor from a worker for a moment.
    std::condition_variable m_hasPlace, m_hasWork, m_hasDone;
    std::deque<std::shared_ptr<Slot>> m_slots;
    BatchStep m_batch;
    std::size_t m_capacity;
    bool m_isStopping = false;
    bool m_isFilled = false;         // the source has ended
    std::exception_ptr m_fillError;  // rethrown after the last item
    std::vector<std::thread> m_threads;
};

}  // namespace velmora::hosts
