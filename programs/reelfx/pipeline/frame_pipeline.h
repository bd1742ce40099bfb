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
#include <string>
#include <thread>
#include <vector>

#include "programs/reelfx/media/av_handles.h"

namespace velmora::hosts {

// A frame in the pipeline, or a packet of another stream that keeps its place between the frames.
struct PipelineItem {
    FramePtr frame;          // the source; the worker replaces it with the result
    PacketPtr packet;        // set: there is nothing to work on
    std::int64_t index = 0;  // of the frame in the clip
    double seconds = 0.0;    // since the clip's first frame
    std::string digest;      // if requested
};
using PipelineItemPtr = std::unique_ptr<PipelineItem>;

class FramePipeline {
  public:
    using Source = std::function<PipelineItemPtr()>;    // null at the end; called from one thread
    using Worker = std::function<void(PipelineItem&)>;  // each is called from one thread

    FramePipeline(Source source, std::vector<Worker> workers);
    ~FramePipeline();  // stops at the next frame
    FramePipeline(const FramePipeline&) = delete;
    FramePipeline& operator=(const FramePipeline&) = delete;

    // The next finished item; null after the last. Rethrows what the source or a worker threw, at the item's
    // turn.
    PipelineItemPtr Next();

  private:
    enum class Stage { kWaiting, kInWork, kDone };
    struct Slot {
        PipelineItemPtr item;
        Stage stage = Stage::kWaiting;
        std::exception_ptr error;
    };

    void Start(Source source, std::vector<Worker>& workers);
    void Stop();
    void Fill(const Source& source);
    void Work(const Worker& worker);
    Slot* FirstWaiting();

    std::mutex m_mutex;
    std::condition_variable m_changed;
    std::deque<std::shared_ptr<Slot>> m_slots;
    std::size_t m_capacity;
    bool m_isStopping = false;
    bool m_isFilled = false;         // the source has ended
    std::exception_ptr m_fillError;  // rethrown after the last item
    std::vector<std::thread> m_threads;
};

}  // namespace velmora::hosts
