#include "exBase.h"

namespace Orv {

ExBase::ExBase(const char* file, int line) noexcept : _file(file), _line(line) {}

ExBase::ExBase(const ExBase&) noexcept = default;

ExBase& ExBase::operator=(const ExBase&) noexcept = default;

ExBase::~ExBase() = default;

const char* ExBase::what() const noexcept {
    return getReason();
}

const char* ExBase::getReason() const noexcept {
    return _reason ? _reason->c_str() : "";
}

void ExBase::setReason(std::string_view reason) {
    _reason = std::make_shared<const std::string>(reason);
}

void ExBase::appendReason(std::string_view piece) {
    setReason(std::string(getReason()).append(piece));
}

}  // namespace Orv
