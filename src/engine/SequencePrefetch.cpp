#include "engine/SequencePrefetch.h"

#include <utility>

#include "sequencelib/Sequence.h"

namespace vtr {
namespace {

// Raised from a load's progress to give it up when the prefetch stops.
struct Abandoned {};

}  // namespace

SequencePrefetch::SequencePrefetch(int workers, std::size_t ahead) : ahead_(ahead < 1 ? 1 : ahead) {
    workers_.reserve(static_cast<std::size_t>(workers));
    for (int i = 0; i < workers; ++i)
        workers_.emplace_back([this] { Work(); });
}

SequencePrefetch::~SequencePrefetch() {
    Stop();
    workers_.clear();  // joins
}

void SequencePrefetch::Want(const std::string& fileName) {
    {
        std::lock_guard lock(mutex_);
        if (stopping_ || !entries_.try_emplace(fileName).second)
            return;
        wanted_.push_back(fileName);
    }
    workAvailable_.notify_one();
}

std::optional<SequencePrefetch::Load> SequencePrefetch::Take(const std::string& fileName) {
    std::unique_lock lock(mutex_);
    auto [found, added] = entries_.try_emplace(fileName);
    Entry& entry = found->second;
    if (added || entry.state == State::Wanted || entry.state == State::Taken) {
        entry.state = State::Taken;
        return std::nullopt;
    }
    loadFinished_.wait(lock, [&] { return entry.state == State::Ready; });
    entry.state = State::Taken;
    if (entry.counted) {
        entry.counted = false;
        --untaken_;
    }
    std::optional<Load> load;
    if (!entry.abandoned)
        load = std::move(entry.load);
    entry.load = {};
    lock.unlock();
    workAvailable_.notify_one();  // room ahead for one more
    return load;
}

void SequencePrefetch::Stop() {
    {
        std::lock_guard lock(mutex_);
        stopping_ = true;
    }
    workAvailable_.notify_all();
}

void SequencePrefetch::Work() {
    std::unique_lock lock(mutex_);
    for (;;) {
        workAvailable_.wait(
            lock, [&] { return stopping_ || (next_ < wanted_.size() && untaken_ < ahead_); });
        if (stopping_)
            return;
        const std::string fileName = wanted_[next_++];
        Entry& entry = entries_.at(fileName);
        if (entry.state != State::Wanted)
            continue;  // the caller took it first
        entry.state = State::Loading;
        entry.counted = true;
        ++untaken_;
        lock.unlock();

        // The entry stays where it is while this worker loads it: only this worker changes
        // a loading entry, and entries are never removed.
        Load load;
        bool abandoned = false;
        try {
            auto sequence = std::make_shared<seqlib::Sequence>();
            sequence->Load(fileName, [&](int32_t percent) {
                if (stopping_)
                    throw Abandoned{};
                load.progress.push_back(percent);
            });
            load.sequence = std::move(sequence);
        } catch (const Abandoned&) {
            abandoned = true;
        } catch (...) {
            load.failure = std::current_exception();
        }

        lock.lock();
        if (!load.sequence) {
            entry.counted = false;
            --untaken_;
            workAvailable_.notify_all();
        }
        entry.load = std::move(load);
        entry.abandoned = abandoned;
        entry.state = State::Ready;
        loadFinished_.notify_all();
    }
}

}  // namespace vtr
