#include "programs/reelfx/pipeline/frame_pipeline.h"

#include <algorithm>
#include <utility>

namespace velmora::hosts {

FramePipeline::FramePipeline(Source source, std::vector<Worker> workers)
    // Enough that no worker waits for another, few enough that large frames fit into memory.
    : m_capacity(2 * workers.size() + 2) {
    try {
        Start(std::move(source), workers);
    } catch (...) {
        Stop();  // the system has no more threads
        throw;
    }
}

FramePipeline::~FramePipeline() {
    Stop();
}

void FramePipeline::Start(Source source, std::vector<Worker>& workers) {
    m_threads.reserve(workers.size() + 1);
    m_threads.emplace_back([this, fill = std::move(source)] {
        std::exception_ptr error;
        try {
            Fill(fill);
        } catch (...) {
            error = std::current_exception();
        }
        {
            const std::lock_guard lock(m_mutex);
            m_fillError = error;
            m_isFilled = true;
        }
        m_changed.notify_all();
    });
    for (Worker& worker : workers) {
        m_threads.emplace_back([this, work = std::move(worker)] { Work(work); });
    }
}

void FramePipeline::Stop() {
    {
        const std::lock_guard lock(m_mutex);
        m_isStopping = true;
    }
    m_changed.notify_all();
    for (std::thread& thread : m_threads) thread.join();
}

void FramePipeline::Fill(const Source& source) {
    while (PipelineItemPtr item = source()) {
        const auto slot = std::make_shared<Slot>();
        const bool hasWork = !item->packet;
        slot->item = std::move(item);
        if (!hasWork) slot->stage = Stage::kDone;
        std::unique_lock lock(m_mutex);
        // Packets are small and many; only frames count against the capacity.
        const auto isRoom = [&] {
            const auto frames = std::ranges::count_if(
                m_slots, [](const auto& each) { return each->item && !each->item->packet; });
            return m_isStopping || !hasWork || static_cast<std::size_t>(frames) < m_capacity;
        };
        m_changed.wait(lock, isRoom);
        if (m_isStopping) return;
        m_slots.push_back(slot);
        lock.unlock();
        m_changed.notify_all();
    }
}

FramePipeline::Slot* FramePipeline::FirstWaiting() {
    const auto found =
        std::ranges::find_if(m_slots, [](const auto& slot) { return slot->stage == Stage::kWaiting; });
    return found == m_slots.end() ? nullptr : found->get();
}

void FramePipeline::Work(const Worker& worker) {
    std::unique_lock lock(m_mutex);
    for (;;) {
        Slot* slot = nullptr;
        m_changed.wait(lock, [&] {
            slot = FirstWaiting();
            return m_isStopping || slot || m_isFilled;
        });
        if (m_isStopping || !slot) return;
        slot->stage = Stage::kInWork;  // it stays in the queue until it is done, so the pointer stays valid
        lock.unlock();
        try {
            worker(*slot->item);
        } catch (...) {
            slot->error = std::current_exception();
        }
        lock.lock();
        slot->stage = Stage::kDone;
        m_changed.notify_all();
    }
}

PipelineItemPtr FramePipeline::Next() {
    std::unique_lock lock(m_mutex);
    m_changed.wait(lock,
                   [&] { return m_slots.empty() ? m_isFilled : m_slots.front()->stage == Stage::kDone; });
    if (m_slots.empty()) {
        if (m_fillError) std::rethrow_exception(std::exchange(m_fillError, nullptr));
        return nullptr;
    }
    const std::shared_ptr<Slot> slot = std::move(m_slots.front());
    m_slots.pop_front();
    lock.unlock();
    m_changed.notify_all();
    if (slot->error) std::rethrow_exception(slot->error);
    return std::move(slot->item);
}

}  // namespace velmora::hosts
