/* workers.h: does many pieces of work at once, and delivers their results in order. */
#ifndef CDGEN_CDEF_BUILD_WORKERS_H
#define CDGEN_CDEF_BUILD_WORKERS_H

#include "cdef/support/interruption.h"

#include <algorithm>
#include <condition_variable>
#include <cstddef>
#include <exception>
#include <functional>
#include <mutex>
#include <optional>
#include <system_error>
#include <thread>
#include <vector>

namespace cdef::build_command {

/* Pieces of work that threads take one after another, and their results. An exception of a piece is thrown by take().
 * If the system does not start as many threads as wanted, there are fewer. */
template <class Result> class worker_pool {
public:
    using work_function = std::function<Result(std::size_t)>;

    worker_pool(std::size_t count, unsigned threads, work_function work_wanted)
        : work(std::move(work_wanted)), results(count) {
        pool.reserve(threads);
        try {
            while (pool.size() < threads)
                pool.emplace_back([this] { run(); });
        } catch (const std::exception &) { /* no more can be started; those that there are do all pieces */
        }
    }
    worker_pool(const worker_pool &) = delete;
    worker_pool &operator=(const worker_pool &) = delete;
    /* Stops: no further piece is begun. */
    ~worker_pool() {
        {
            std::lock_guard hold(guard);
            begun = results.size();
        }
        for (std::thread &thread : pool)
            thread.join();
    }

    /* Waits for a piece's result and returns it. Each result can be taken only once. Without threads, the caller does
     * the pieces. */
    Result take(std::size_t index) {
        if (pool.empty())
            return work(index);
        std::unique_lock hold(guard);
        finished.wait(hold, [&] { return results[index].value.has_value() || results[index].error; });
        if (results[index].error)
            std::rethrow_exception(results[index].error);
        Result result = std::move(*results[index].value);
        results[index].value.reset();
        return result;
    }

private:
    struct piece {
        std::optional<Result> value;
        std::exception_ptr error;
    };

    void run() {
        std::unique_lock hold(guard);
        while (begun < results.size()) {
            std::size_t index = begun++;
            hold.unlock();
            piece done;
            try {
                done.value = work(index);
            } catch (...) {
                done.error = std::current_exception();
            }
            hold.lock();
            results[index] = std::move(done);
            finished.notify_one();
        }
    }

    work_function work;
    std::mutex guard;
    std::condition_variable finished;
    std::vector<piece> results;
    std::size_t begun = 0;
    std::vector<std::thread> pool;
};

/* Does the pieces 0 to count - 1, this many at once or fewer if the system does not start so many threads, and delivers
 * their results in order. With more than one at once, signals that end the program are held back until no piece is
 * doing uninterrupted work. */
template <class Result>
void do_in_order(std::size_t count, unsigned at_once, const std::function<Result(std::size_t)> &work,
                 const std::function<void(std::size_t, Result &&)> &deliver) {
    std::optional<interruption_watch> watch;
    try {
        if (at_once > 1 && count > 1)
            watch.emplace();
    } catch (const std::system_error &) { /* no thread can be started */
    }
    if (!watch) {
        for (std::size_t index = 0; index < count; ++index)
            deliver(index, work(index));
        return;
    }
    worker_pool<Result> pool(count, static_cast<unsigned>(std::min<std::size_t>(at_once, count)), work);
    for (std::size_t index = 0; index < count; ++index)
        deliver(index, pool.take(index));
}

} // namespace cdef::build_command

#endif
