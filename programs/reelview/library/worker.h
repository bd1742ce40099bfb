// The one thread that reads clips and renders. Work comes as tasks; what they find goes back to the window's thread.
#pragma once

#include <condition_variable>
#include <cstddef>
#include <deque>
#include <functional>
#include <mutex>
#include <thread>

namespace velmora::reelview {

class Worker {
  public:
    using Task = std::function<void()>;

    // `start` and `end` run on the thread, first and last.
    Worker(Task start, Task end);
    // Finishes the task in hand and drops the others.
    ~Worker();
    Worker(const Worker&) = delete;
    Worker& operator=(const Worker&) = delete;

    // In their order, before anything else.
    void Post(Task task);
    // What the user looks at: a newer one replaces one that has not begun.
    void PostPreview(Task task);
    // Idle time: begun when there is nothing else.
    void PostIdle(Task task);
    void DropIdle();
    // False when the task in hand does not end within the time.
    [[nodiscard]] bool Stop(double seconds);

  private:
    void Run(const Task& start, const Task& end);
    Task Next();

    std::mutex m_mutex;
    std::condition_variable m_wake;
    std::deque<Task> m_tasks, m_idle;
    Task m_preview;
    bool m_isStopping = false, m_hasEnded = false;
    std::thread m_thread;  // last: it uses what stands above
};

}  // namespace velmora::reelview
