#pragma once

#include "lkTicket.h"

namespace Orv {

/// A thread's turn: waits for its number and passes the turn on when it goes.
class ORV_RESMGT_API LkTicketGuard {
public:
    /// @param ticket  borrowed, must outlive the guard.
    /// @param number  as LkTicket::waitForTicket.
    [[nodiscard]] LkTicketGuard(LkTicket& ticket, std::int64_t number) : _ticket(ticket) {
        _ticket.waitForTicket(number);
    }
    ~LkTicketGuard() noexcept(false) { _ticket.next(); }

    LkTicketGuard(const LkTicketGuard&) = delete;
    LkTicketGuard& operator=(const LkTicketGuard&) = delete;

private:
    LkTicket& _ticket;
};

}  // namespace Orv
