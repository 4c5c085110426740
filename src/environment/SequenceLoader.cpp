#include "environment/SequenceLoader.h"

#include "engine/LibVerify.h"

namespace vtr {

SequenceLoader::~SequenceLoader() {
    // The sequence itself lives on wherever it was handed.
    sequence_ = nullptr;
}

namespace {

// The verification under way was cancelled (the flag outlives its run).
bool RunCancelled() {
    return LibVerify::IsVerifying() && LibVerify::IsCancelled();
}

}  // namespace

std::shared_ptr<seqlib::Sequence> SequenceLoader::Load(const std::string& fileName) {
    if (RunCancelled())
        return nullptr;
    fileName_ = fileName;
    sequence_ = std::make_shared<seqlib::Sequence>();
    seqlib::LoadOptions options;
    options.keepGoing = [this] { return KeepGoing(); };
    options.pollInterval = kPumpInterval;
    if (!sequence_->Load(
            fileName, [this](int32_t percent) { OnProgress(percent); }, options)) {
        return nullptr;
    }
    return sequence_;
}

void SequenceLoader::OnProgress(int32_t percent) {
    TellProgress(fileName_, percent);
    justPumped_ = true;
}

void SequenceLoader::TellProgress(const std::string& fileName, int32_t percent) {
    LibVerify::PostTransientMessage("Loading " + std::to_string(percent) + "% of " + fileName);
    LibVerify::ProcessPendingEvents();
}

// Asked after each percent (whose text has just let the user interface in) and after
// kPumpInterval of work without one.
bool SequenceLoader::KeepGoing() {
    if (!justPumped_)
        LibVerify::ProcessPendingEvents();
    justPumped_ = false;
    return !RunCancelled();
}

}  // namespace vtr
