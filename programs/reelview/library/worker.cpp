#include "programs/reelview/library/worker.h"

#include <chrono>
#include <utility>

namespace velmora::reelview {

Worker::Worker(Task start, Task end)
    : m_thread([this, start = std::move(start), end = std::move(end)] { Run(start, end); }) {}

Worker::~Worker() {
    {
        const std::lock_guard lock(m_mutex);
        m_isStopping = true;
    }
    m_wake.notify_all();
    m_thread.join();
}

void Worker::Post(Task task) {
    {
        const std::lock_guard lock(m_mutex);
        m_tasks.push_back(std::move(task));
    }
    m_wake.notify_all();
}

void Worker::PostPreview(Task task) {
    {
        const std::lock_guard lock(m_mutex);
        m_preview = std::move(task);
    }
    m_wake.notify_all();
}

void Worker::PostIdle(Task task) {
    {
        const std::lock_guard lock(m_mutex);
        m_idle.push_back(std::move(task));
    }
    m_wake.notify_all();
}

void Worker::DropIdle() {
    const std::lock_guard lock(m_mutex);
    m_idle.clear();
}

bool Worker::Stop(double seconds) {
    std::unique_lock lock(m_mutex);
    m_isStopping = true;
    m_wake.notify_all();
    return m_wake.wait_for(lock, std::chrono::duration<double>(seconds), [this] { return m_hasEnded; });
}

Worker::Task Worker::Next() {
    std::unique_lock lock(m_mutex);
    m_wake.wait(lock, [this] { return m_isStopping || !m_tasks.empty() || m_preview || !m_idle.empty(); });
    if (m_isStopping) return {};
    Task task;
    if (!m_tasks.empty()) {
        task = std::move(m_tasks.front());
        m_tasks.pop_front();
    } else if (m_preview) {
        std::swap(task, m_preview);
    } else {
        task = std::move(m_idle.front());
        m_idle.pop_front();
    }
    return task;
}

void Worker::Run(const Task& start, const Task& end) {
    start();
    while (const Task task = Next()) task();
    end();
    const std::lock_guard lock(m_mutex);
    m_hasEnded = true;
    m_wake.notify_all();
}

}  // namespace velmora::reelview
