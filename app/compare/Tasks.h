// Tasks: runs work in several threads.
#ifndef MORVIK_APP_COMPARE_TASKS_H
#define MORVIK_APP_COMPARE_TASKS_H

#include <condition_variable>
#include <cstddef>
#include <deque>
#include <functional>
#include <mutex>
#include <thread>
#include <vector>

namespace morvik {

/// Tasks begin in the order in which they are added, and may not throw.
class Tasks {
public:
    explicit Tasks(std::size_t threads)
    {
        for (std::size_t i = 0; i < threads; ++i) {
            itsThreads.emplace_back([this] { work(); });
        }
    }

    Tasks(const Tasks&) = delete;
    Tasks& operator=(const Tasks&) = delete;

    /// Waits for all tasks.
    ~Tasks()
    {
        {
            const std::lock_guard lock(itsMutex);
            itsIsEnding = true;
        }
        itsChange.notify_all();
        for (std::thread& thread : itsThreads) {
            thread.join();
        }
    }

    /// Waits until no more tasks are waiting than there are threads.
    void add(std::function<void()> task)
    {
        std::unique_lock lock(itsMutex);
        itsChange.wait(lock, [this] { return itsWaiting.size() < itsThreads.size(); });
        itsWaiting.push_back(std::move(task));
        itsChange.notify_all();
    }

private:
    void work()
    {
        for (;;) {
            std::unique_lock lock(itsMutex);
            itsChange.wait(lock, [this] { return itsIsEnding || !itsWaiting.empty(); });
            if (itsWaiting.empty()) {
                return;
            }
            const std::function<void()> task = std::move(itsWaiting.front());
            itsWaiting.pop_front();
            itsChange.notify_all();
            lock.unlock();
            task();
        }
    }

    std::mutex itsMutex;
    std::condition_variable itsChange;
    std::deque<std::function<void()>> itsWaiting;
    bool itsIsEnding = false;
    std::vector<std::thread> itsThreads;
};

}  // namespace morvik

#endif
