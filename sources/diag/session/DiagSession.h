// The command side of a DIAG port: requests go out framed, replies are picked out of the
// stream by their command (log packets and event reports that come between go on to the
// decoders as always), and every command waits at most the command timeout.
//
// start(): version (0x00) and build id (0x7C), said in one line; the modem's log ranges
// (LOG_CONFIG op 1); one SET_MASK (op 3) per equipment id the modem has items for, with
// exactly the codes the decoders take that fit its range (those that do not are said); event
// reports on (0x60 01). stop(): event reports off (0x60 00), all log masks off (op 0).
#pragma once

#include <chrono>
#include <cstdint>
#include <deque>
#include <functional>
#include <span>
#include <string_view>
#include <vector>

#include "core/Value.h"
#include "sources/diag/port/DiagPort.h"
#include "sources/diag/port/StopSignal.h"
#include "sources/diag/session/DiagCommands.h"
#include "sources/diag/session/SessionError.h"
#include "sources/diag/stream/DiagStream.h"

namespace pyx::diag {

class DiagSession {
  public:
    struct Options {
        std::chrono::milliseconds commandTimeout{2000};
        // The session's notes: the modem's version and build id, what logging is on.
        std::function<void(std::string_view line)> onNote;
        // Its faults that do not end the session: a mask the modem refuses, codes its log
        // ranges leave out.
        std::function<void(std::string_view line)> onFault;
        // Every byte read from the port, before the stream sees it (the .qmdl).
        std::function<void(std::span<const std::uint8_t> bytes)> onBytes;
    };

    // What start() did.
    struct Started {
        ModemIdentity identity;
        LogRanges ranges{};
        std::size_t codesOn = 0;
        std::vector<std::uint16_t> leftOut;
        std::vector<std::uint32_t> refusedEquipmentIds;
    };

    // Talks over port; what it reads goes to stream, whose events go to onEvents. stop wakes
    // every wait of start() and pump().
    DiagSession(DiagPort& port, DiagStream& stream, DiagStream::EventSink onEvents,
                const StopSignal& stop, Options options);

    // The start-up commands. Throws SessionError when the modem answers nothing (or refuses
    // to give its log ranges) and PortError when the port goes away; false when stop came
    // first.
    bool start();
    [[nodiscard]] const Started& started() const { return started_; }

    // Reads what comes for up to upTo (less when stop comes) and hands it on. Throws PortError
    // when the port goes away.
    void pump(std::chrono::milliseconds upTo);

    // Turns event reports and every log mask off. Waits the command timeout at most, stop
    // requested or not; a port gone meanwhile is nothing to turn off.
    void stop();

  private:
    struct Reply {
        Bytes packet;
        bool answered = false;
        [[nodiscard]] explicit operator bool() const { return answered; }
    };

    // Sends request and waits for its reply (none: the timeout, or stop when wakeOnStop).
    Reply command(const Bytes& request, bool wakeOnStop);
    void send(const Bytes& request);
    void readOnce(std::chrono::milliseconds timeout, int wakeFd);
    void setMask(const EquipmentMask& mask);

    DiagPort& port_;
    DiagStream& stream_;
    DiagStream::EventSink onEvents_;
    const StopSignal& stop_;
    Options options_;
    Started started_;
    std::deque<Bytes> replies_;  // replies read and not yet matched
    bool spoke_ = false;         // the modem answered the version request
    std::vector<std::uint8_t> buffer_;
};

}  // namespace pyx::diag
