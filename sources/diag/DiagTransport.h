// A Qualcomm modem's diagnostic (DIAG) port as a source: the metric events the decoders write
// from its log packets go to the client as the other basebands' events do.
//
// Two inputs. A capture file (a raw byte stream of the port: .qmdl, .mi2log, .bin) is played
// as a replay is: in the order of its packets, spaced by the modem's own timestamps divided by
// the speed (0: as fast as the store takes them), again from the start with loop, and at its
// end the transport says so and calls onEnd. The live port is a DiagLink on a thread of its
// own: found or named, opened, set up, waited for when it goes away; its faults go to the
// system log's fault line.
//
// The programs' start-up commands are answered as the modem source answers them: a
// configuration is accepted when it parses (the decoders write whatever the modem logs, the
// configuration chooses nothing), and queries are refused: a DIAG port answers none of ours
// (the SIM files among them). Events flow from the first startEvents after a configuration was
// accepted; a later restart goes on where the last one stopped. When the events stop (the end
// of a capture, or stopEvents while they flow) one line on the fault line sums up the packets
// decoded, not decoded and the bad frames so far.
#pragma once

#include <condition_variable>
#include <cstddef>
#include <cstdint>
#include <fstream>
#include <functional>
#include <memory>
#include <mutex>
#include <optional>
#include <stdexcept>
#include <stop_token>
#include <string>
#include <thread>
#include <vector>

#include "baseband/velk/Transport.h"
#include "sources/diag/port/DiagLink.h"
#include "sources/diag/stream/DiagStream.h"

namespace pyx::diag {

// A capture file that cannot be played (missing, unreadable, a directory); what() is one line
// naming the file and the reason.
class DiagCaptureError : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

// What a stream's packets came to: the counts of the summary line.
struct PacketCounts {
    std::uint64_t decoded = 0;
    std::uint64_t notDecoded = 0;  // no row, a row that refused it, or a malformed header
    std::uint64_t badFrames = 0;
};
[[nodiscard]] PacketCounts packetCounts(const StreamStats& stats);
// "120 packets decoded, 3 not decoded, 1 bad frame" (and ", a final frame cut short (N bytes)"
// when there was one).
[[nodiscard]] std::string summaryText(const StreamStats& stats);

class DiagTransport : public velk::client::Transport {
  public:
    struct Options {
        // A capture file to play; empty: the live port of link.
        std::string capture;
        // The live port (path, qmdlFile...); its onLine, when empty, is the system log's fault
        // line.
        DiagLink::Options link;

        // A capture: its timing divided by this; 0 (or infinity) plays as fast as it is taken.
        double speed = 1.0;
        bool loop = false;
        // Events handed out and not yet taken by the store; none: no limit.
        std::function<std::size_t()> backlog;
        std::size_t maxBacklog = 1024;
        // Called once, on the transport's thread, when a capture is over: after its last packet
        // without loop, or at once with loop for a capture that holds no packet we decode.
        std::function<void(bool damaged)> onEnd;
        // How much of a capture is read at a time.
        std::size_t chunkBytes = 64 * 1024;
    };

    // A capture is opened at once: throws DiagCaptureError when it cannot be, and
    // std::invalid_argument for a negative or NaN speed.
    explicit DiagTransport(Options options);
    // Stops the thread (the live link turns logging off first).
    ~DiagTransport() override;
    DiagTransport(const DiagTransport&) = delete;
    DiagTransport& operator=(const DiagTransport&) = delete;

    velk::Result performCommand(const std::string& command, const Value& input,
                                Value* output) override;
    void startEvents(EventSink sink) override;
    void stopEvents() override;

    // A capture: whether it has been played to its end (without loop: it is over).
    [[nodiscard]] bool finished() const;
    // What the stream has seen so far: the capture's current pass, or the live link's.
    [[nodiscard]] StreamStats stats() const;

  private:
    // The capture being played; kept across a stop and a start, touched by the thread only.
    struct Playback {
        std::ifstream file;
        std::optional<DiagStream> stream;
        std::vector<DecodedPacket> ready;  // decoded from the last chunk, not yet handed out
        std::size_t next = 0;              // the first of ready not handed out
        std::uint64_t handedOut = 0;       // packets handed out this pass
    };

    void playCapture(const std::stop_token& stop, const EventSink& sink);
    void runLink(const std::stop_token& stop, const EventSink& sink);
    // Opens the capture for a new pass with a fresh stream.
    void rewind();
    // Waits until the store has caught up; false when asked to stop meanwhile.
    bool waitForRoom(const std::stop_token& stop);
    // Waits until due; false when asked to stop meanwhile.
    bool waitUntil(const std::stop_token& stop, std::chrono::steady_clock::time_point due);
    // Says the end of a pass once, and ends the capture (onEnd) unless it plays again.
    void endOfCapture(bool again, bool damaged);
    void stopThread();

    const Options options_;
    std::unique_ptr<DiagLink> link_;  // live only
    Playback playback_;

    std::mutex controlMutex_;   // serialises starting and stopping the thread
    mutable std::mutex mutex_;  // guards what follows
    bool configured_ = false;
    bool started_ = false;
    bool finished_ = false;
    bool endSaid_ = false;
    StreamStats lastStats_;  // the capture's: updated as it plays

    std::mutex waitMutex_;
    std::condition_variable_any wake_;
    std::jthread thread_;
};

}  // namespace pyx::diag
