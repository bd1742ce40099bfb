#include "programs/reelfx/pipeline/frame_pipeline.h"

#include <algorithm>
#include <utility>

namespace velmora::hosts {

namespace {

// One item waits for the next free worker and one for the reader of results, or several for their second step; more
// would only hold memory.
std::size_t CapacityFor(std::size_t workers, const BatchStep& batch) {
    return workers + std::max<std::size_t>(2, batch.most);
}

}  // namespace

FramePipeline::FramePipeline(Source source, std::vector<Worker> workers, BatchStep batch)
    : m_batch(std::move(batch)), m_capacity(CapacityFor(workers.size(), m_batch)) {
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
        WakeAll();
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
    WakeAll();
    for (std::thread& thread : m_threads) thread.join();
}

void FramePipeline::WakeAll() {
    m_hasPlace.notify_all();
    m_hasWork.notify_all();
    m_hasDone.notify_all();
}

void FramePipeline::Fill(const Source& source) {
    for (;;) {
        {
            // Before reading: the item read would be one more in memory.
            std::unique_lock lock(m_mutex);
            m_hasPlace.wait(lock, [&] { return m_isStopping || !IsFull(); });
            if (m_isStopping) return;
        }
        PipelineItemPtr item = source();
        if (!item) return;
        const auto slot = std::make_shared<Slot>();
        const bool hasWork = !item->packet;
        if (!hasWork) slot->stage = Stage::kDone;
        slot->item = std::move(item);
        {
            const std::lock_guard lock(m_mutex);
            m_slots.push_back(slot);
        }
        (hasWork ? m_hasWork : m_hasDone).notify_one();
    }
}

FramePipeline::Slot* FramePipeline::FirstWaiting() const {
    const auto found =
        std::ranges::find_if(m_slots, [](const auto& slot) { return slot->stage == Stage::kWaiting; });
    return found == m_slots.end() ? nullptr : found->get();
}

bool FramePipeline::IsFull() const {
    const auto frames =
        std::ranges::count_if(m_slots, [](const auto& each) { return each->item && !each->item->packet; });
    return static_cast<std::size_t>(frames) >= m_capacity;
}

bool FramePipeline::IsFrontDone() const {
    return !m_slots.empty() && m_slots.front()->stage == Stage::kDone;
}

bool FramePipeline::Has(Stage stage) const {
    return std::ranges::any_of(m_slots, [&](const auto& slot) { return slot->stage == stage; });
}

std::vector<FramePipeline::Slot*> FramePipeline::NextBatch() const {
    std::vector<Slot*> slots;
    for (const auto& slot : m_slots) {
        if (slot->stage == Stage::kWorked && slots.size() < m_batch.most) slots.push_back(slot.get());
    }
    // Frames that are done but behind one that is not keep the queue full as well; then no more of them come.
    const bool isBusy = Has(Stage::kWaiting) || Has(Stage::kInWork) || Has(Stage::kInBatch);
    const bool isAll = !isBusy && (m_isFilled || IsFull());
    return slots.size() == m_batch.most || isAll ? slots : std::vector<Slot*>();
}

void FramePipeline::Work(const Worker& worker) {
    std::unique_lock lock(m_mutex);
    for (;;) {
        Slot* slot = nullptr;
        std::vector<Slot*> batch;
        m_hasWork.wait(lock, [&] {
            batch = NextBatch();
            slot = batch.empty() ? FirstWaiting() : nullptr;
            return m_isStopping || slot || !batch.empty() || (m_isFilled && !Has(Stage::kWorked));
        });
        if (m_isStopping || (!slot && batch.empty())) return;
        // A slot stays in the queue until it is done, so the pointer stays valid.
        if (slot) slot->stage = Stage::kInWork;
        for (Slot* const each : batch) each->stage = Stage::kInBatch;
        lock.unlock();
        slot ? WorkOn(*slot, worker) : WorkOn(batch);
        lock.lock();
        if (slot) slot->stage = m_batch.work && !slot->error ? Stage::kWorked : Stage::kDone;
        for (Slot* const each : batch) each->stage = Stage::kDone;
        if (IsFrontDone()) m_hasDone.notify_one();
    }
}

void FramePipeline::WorkOn(Slot& slot, const Worker& worker) {
    try {
        worker(*slot.item);
    } catch (...) {
        slot.error = std::current_exception();
    }
}

void FramePipeline::WorkOn(const std::vector<Slot*>& slots) const {
    std::vector<PipelineItem*> items;
    items.reserve(slots.size());
    for (const Slot* const slot : slots) items.push_back(slot->item.get());
    try {
        m_batch.work(items);
    } catch (...) {
        for (Slot* const slot : slots) slot->error = std::current_exception();
    }
}

PipelineItemPtr FramePipeline::Next() {
    std::unique_lock lock(m_mutex);
    m_hasDone.wait(lock, [&] { return m_slots.empty() ? m_isFilled : IsFrontDone(); });
    if (m_slots.empty()) {
        if (m_fillError) std::rethrow_exception(std::exchange(m_fillError, nullptr));
        return nullptr;
    }
    const bool wasFull = IsFull();
    const std::shared_ptr<Slot> slot = std::move(m_slots.front());
    m_slots.pop_front();
    lock.unlock();
    if (wasFull) m_hasPlace.notify_one();
    if (slot->error) std::rethrow_exception(slot->error);
    return std::move(slot->item);
}

}  // namespace velmora::hosts
