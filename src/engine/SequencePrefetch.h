#pragma once

#include <atomic>
#include <condition_variable>
#include <cstddef>
#include <cstdint>
#include <exception>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <thread>
#include <unordered_map>
#include <vector>

namespace vtr {
namespace seqlib {
class Sequence;
}

namespace LibVerify {
// How many processors a run loads sequence files on. With more than one, worker threads load
// the files the queued checks will ask for, in the order they will ask, ahead of them; the
// checks, results, notifications and the log stay on the caller's thread, in the same order
// as with one, and a load's progress is told when its check takes the file. 0 (the default)
// is every processor of the machine; 1 loads each file when a check asks for it, on the
// caller's thread alone. Takes effect at the next run.
void SetLoadingJobs(int jobs);
// The number of processors a run uses, 0 resolved to the machine's (at least 1).
int LoadingJobs();
}  // namespace LibVerify

// Loads sequence files on worker threads ahead of the checks that will ask for them. The
// driver names the files in the order its queue will ask for them; the workers take them in
// that order, never more than a fixed number ahead of what has been taken, so that memory
// stays bounded however long the queue. Nothing here reports anything: a load's progress and
// failure are kept for the caller's thread to tell, in its own order.
class SequencePrefetch {
  public:
    // What a worker's load of one file came to.
    struct Load {
        std::shared_ptr<seqlib::Sequence> sequence;  // nullptr when the load failed
        std::exception_ptr failure;                  // what the load raised, if anything
        std::vector<int32_t> progress;               // the percents it went through, in order
    };

    // `workers` threads, loading at most `ahead` files that have not been taken yet.
    SequencePrefetch(int workers, std::size_t ahead);
    // Stops the workers (a load under way is abandoned at its next progress step) and waits
    // for them.
    ~SequencePrefetch();
    SequencePrefetch(const SequencePrefetch&) = delete;
    SequencePrefetch& operator=(const SequencePrefetch&) = delete;

    // Adds a file to those the workers will load, after those named before. A file named
    // before, or already taken, is not loaded again.
    void Want(const std::string& fileName);
    // The workers' load of the file, waiting for it when one is under way; nothing when no
    // worker has started it (or one gave it up), in which case the file is the caller's to
    // load and no worker will touch it from now on.
    std::optional<Load> Take(const std::string& fileName);
    // Stops loading: files not started are left, loads under way are given up at their next
    // progress step. Take still answers (with nothing for what was given up).
    void Stop();

  private:
    enum class State { Wanted, Loading, Ready, Taken };
    struct Entry {
        State state = State::Wanted;
        Load load;
        bool abandoned = false;
        // Counted in untaken_: loading, or loaded and holding a sequence. A load that failed
        // holds nothing and leaves room at once, since no check may ever take it (one that
        // skips a file missing on disk, for instance).
        bool counted = false;
    };

    void Work();

    std::mutex mutex_;
    std::condition_variable workAvailable_;  // a file to load, room ahead, or stop
    std::condition_variable loadFinished_;
    std::vector<std::string> wanted_;  // in the order the checks will ask
    std::size_t next_ = 0;             // the next of wanted_ for a worker
    std::unordered_map<std::string, Entry> entries_;
    std::size_t untaken_ = 0;  // loading or ready, not yet taken
    std::size_t ahead_;
    std::atomic<bool> stopping_ = false;  // changed under the mutex, read by loads too
    std::vector<std::jthread> workers_;
};

}  // namespace vtr
