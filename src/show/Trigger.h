#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

namespace vtr {

// One input of one unit on one communication network. Triggers are identity objects: they
// are held by std::shared_ptr, and checks tell them apart by address.
class Trigger {
  public:
    // Copies UnitId, InputNumber, Name and Network from other.
    void Copy(const Trigger& other);
    // True when other is present and its UnitId, InputNumber and Network equal this one's;
    // the name takes no part.
    bool Equals(const Trigger* other) const noexcept;
    bool Equals(const std::shared_ptr<Trigger>& other) const noexcept {
        return Equals(other.get());
    }

    int32_t InputNumber() const noexcept { return inputNumber_; }
    void SetInputNumber(int32_t value) noexcept { inputNumber_ = value; }
    const std::string& Name() const noexcept { return name_; }
    void SetName(std::string value) { name_ = std::move(value); }
    int32_t Network() const noexcept { return network_; }
    void SetNetwork(int32_t value) noexcept { network_ = value; }
    int32_t UnitId() const noexcept { return unitId_; }
    void SetUnitId(int32_t value) noexcept { unitId_ = value; }

  private:
    int32_t inputNumber_ = 0;
    std::string name_;
    int32_t network_ = 0;
    int32_t unitId_ = 0;
};

using TriggerPtr = std::shared_ptr<Trigger>;

namespace TriggerFunctions {

// A new trigger with InputNumber, Name, UnitId and Network set in that order.
TriggerPtr CreateTrigger(int32_t network, int32_t unitId, int32_t inputNumber, std::string name);
// (InputNumber,Name,UnitId,Network): numbers in signed-blank form, the name escaped.
// A missing trigger raises error 91.
std::string TriggerToText(const Trigger* trigger);
inline std::string TriggerToText(const TriggerPtr& trigger) {
    return TriggerToText(trigger.get());
}
// Reads the four fields; too few fields, a malformed list or a non-numeric number raise.
TriggerPtr TriggerFromText(std::string_view text);

}  // namespace TriggerFunctions

}  // namespace vtr
