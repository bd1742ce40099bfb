// The only thread that reads clips and renders. It runs tasks, which post their results back to the window's thread.
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

    // `start` and `end` run on the thread, as its first and last calls.
    Worker(Task start, Task end);
    // Finishes the current task and drops the others.
    ~Worker();
    Worker(const Worker&) = delete;
    Worker& operator=(const Worker&) = delete;

    // Run in order, before anything else.
    void Post(Task task);
    // For what the user is looking at. A newer task replaces one that has not started.
    void PostPreview(Task task);
    // Runs when there is nothing else to do.
    void PostIdle(Task task);
    void DropIdle();
    // False when the current task does not finish in time.
    [[nodiscard]] bool Stop(double seconds);

  private:
    void Run(const Task& start, const Task& end);
    Task Next();

    std::mutex m_mutex;
    std::condition_variable m_wake;
    std::deque<Task> m_tasks, m_idle;
    Task m_preview;
    bool m_isStopping = false, m_hasEnded = false;
    std::thread m_thread;  // last: it uses the members above
};

}  // namespace velmora::reelview
