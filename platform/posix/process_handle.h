// What the posix process files share about a Process object: its pid and recorded end.
#pragma once
#include <cstdint>

#include "platform/process.h"

namespace plat::proc {

struct ProcessAccess {
    static void Set(Process& p, int pid) {
        p.id_ = pid;
        p.ended_ = false;
        p.exitCode_ = kStillActive;
    }
    static bool Ended(const Process& p) { return p.ended_; }
    static void MarkEnded(Process& p, std::uint32_t code) {
        p.ended_ = true;
        p.exitCode_ = code;
    }
    static std::uint32_t Code(const Process& p) { return p.exitCode_; }
};

// A process whose handle closed while it still ran: reaped later so that it leaves no zombie.
void Orphan(int pid);
void ReapOrphans();

}  // namespace plat::proc
