#include "show/Trigger.h"

#include "show/ModelErrors.h"
#include "show/Serialize.h"

namespace vtr {

void Trigger::Copy(const Trigger& other) {
    unitId_ = other.unitId_;
    inputNumber_ = other.inputNumber_;
    name_ = other.name_;
    network_ = other.network_;
}

bool Trigger::Equals(const Trigger* other) const noexcept {
    return other != nullptr && other->unitId_ == unitId_ && other->inputNumber_ == inputNumber_ &&
           other->network_ == network_;
}

namespace TriggerFunctions {

TriggerPtr CreateTrigger(int32_t network, int32_t unitId, int32_t inputNumber, std::string name) {
    auto trigger = std::make_shared<Trigger>();
    trigger->SetInputNumber(inputNumber);
    trigger->SetName(std::move(name));
    trigger->SetUnitId(unitId);
    trigger->SetNetwork(network);
    return trigger;
}

std::string TriggerToText(const Trigger* trigger) {
    if (trigger == nullptr) {
        ModelErrors::ObjectNotSet("TriggerFunctions.TriggerToText");
    }
    return Serialize::ListToText(
        {Serialize::LongToText(trigger->InputNumber()), Serialize::EscapeText(trigger->Name()),
         Serialize::LongToText(trigger->UnitId()), Serialize::LongToText(trigger->Network())});
}

TriggerPtr TriggerFromText(std::string_view text) {
    const auto fields = Serialize::ListFromText(text, 1);
    const int32_t network = Serialize::TextToLong(fields[4]);
    const int32_t unitId = Serialize::TextToLong(fields[3]);
    const int32_t inputNumber = Serialize::TextToLong(fields[1]);
    return CreateTrigger(network, unitId, inputNumber, Serialize::UnescapeText(fields[2]));
}

}  // namespace TriggerFunctions

}  // namespace vtr
