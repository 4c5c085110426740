#include "environment/SequenceLoader.h"

#include "engine/LibVerify.h"

namespace vtr {

SequenceLoader::~SequenceLoader() {
    // The sequence itself lives on wherever it was handed.
    sequence_ = nullptr;
}

std::shared_ptr<seqlib::Sequence> SequenceLoader::Load(const std::string& fileName) {
    fileName_ = fileName;
    sequence_ = std::make_shared<seqlib::Sequence>();
    sequence_->Load(fileName, [this](int32_t percent) { OnProgress(percent); });
    return sequence_;
}

void SequenceLoader::OnProgress(int32_t percent) {
    TellProgress(fileName_, percent);
}

void SequenceLoader::TellProgress(const std::string& fileName, int32_t percent) {
    LibVerify::PostTransientMessage("Loading " + std::to_string(percent) + "% of " + fileName);
    LibVerify::ProcessPendingEvents();
}

}  // namespace vtr
