// The DIAG framing: the CRC, frames for the wire, and a byte stream split back into packets
// whatever the pieces it comes in, with noise, bad CRCs and cut frames around the good ones.
#include <gtest/gtest.h>

#include <algorithm>
#include <string>
#include <vector>

#include "sources/diag/frame/Hdlc.h"
#include "tests/sources/diag/support/DiagVectors.h"

namespace pyx::diag::test {
namespace {

struct Deframed {
    std::vector<Bytes> packets;
    Deframer::Counts counts;
    std::size_t pending = 0;
};

// stream fed in pieces of at most piece bytes (0: all at once).
Deframed deframe(std::span<const std::uint8_t> stream, std::size_t piece = 0) {
    Deframer deframer;
    Deframed out;
    const auto onPacket = [&](std::span<const std::uint8_t> packet) {
        out.packets.emplace_back(packet.begin(), packet.end());
    };
    if (piece == 0) piece = std::max<std::size_t>(stream.size(), 1);
    for (std::size_t at = 0; at < stream.size(); at += piece)
        deframer.feed(stream.subspan(at, std::min(piece, stream.size() - at)), onPacket);
    out.counts = deframer.counts();
    out.pending = deframer.pending();
    return out;
}

Bytes concat(std::initializer_list<Bytes> parts) {
    Bytes all;
    for (const Bytes& p : parts) all.insert(all.end(), p.begin(), p.end());
    return all;
}

Bytes ascii(const std::string& text) {
    return Bytes(text.begin(), text.end());
}

// Packets with every awkward byte: flags and escapes at the start, the end and in runs, and
// CRCs that themselves need escaping.
std::vector<Bytes> awkwardPackets() {
    std::vector<Bytes> packets = {
        {0x7E},
        {0x7D},
        {0x7E, 0x7D},
        {0x7D, 0x7E, 0x7D, 0x7E},
        {0x10, 0x7E, 0x7E, 0x7E, 0x00},
        {0x10, 0x7D, 0x5E, 0x7D, 0x5D, 0x20},
        {0x4B, 0x0F, 0x00, 0x00, 0x7D},
        ascii("phon~~~}}~}~}~nk"),
    };
    // The first packets whose CRC holds 0x7E or 0x7D in its low byte, its high byte, or both.
    bool low = false, high = false;
    for (std::uint32_t n = 0; n < 0x10000 && !(low && high); ++n) {
        const Bytes p = {0x10, static_cast<std::uint8_t>(n & 0xFF),
                         static_cast<std::uint8_t>(n >> 8)};
        const std::uint16_t crc = crc16x25(p);
        const bool l = (crc & 0xFF) == 0x7E || (crc & 0xFF) == 0x7D;
        const bool h = (crc >> 8) == 0x7E || (crc >> 8) == 0x7D;
        if ((l && !low) || (h && !high)) packets.push_back(p);
        low = low || l;
        high = high || h;
    }
    // Every length around the CRC's eight-byte steps, each byte a flag or an escape in turn.
    for (std::size_t length = 1; length <= 40; ++length) {
        Bytes p(length);
        for (std::size_t i = 0; i < length; ++i)
            p[i] = static_cast<std::uint8_t>(i % 3 == 0 ? 0x7E : i % 3 == 1 ? 0x7D : i * 37);
        packets.push_back(p);
    }
    return packets;
}

Bytes framed(const std::vector<Bytes>& packets) {
    Bytes stream;
    for (const Bytes& p : packets) appendFrame(p, stream);
    return stream;
}

TEST(Crc16x25, CheckValueOfTheDigits) {
    EXPECT_EQ(crc16x25(ascii("123456789")), 0x906E);
    EXPECT_EQ(crc16x25({}), 0x0000);
}

TEST(Crc16x25, SameForEveryLengthAndAlignment) {
    // Against the bit-by-bit definition, for lengths and start offsets around 8-byte steps.
    Bytes data(80);
    for (std::size_t i = 0; i < data.size(); ++i) data[i] = static_cast<std::uint8_t>(i * 151 + 7);
    for (std::size_t start = 0; start < 8; ++start) {
        for (std::size_t length = 0; start + length <= data.size(); ++length) {
            const std::span<const std::uint8_t> bytes(data.data() + start, length);
            std::uint16_t crc = 0xFFFF;
            for (const std::uint8_t b : bytes) {
                crc ^= b;
                for (int bit = 0; bit < 8; ++bit)
                    crc = static_cast<std::uint16_t>(crc & 1 ? (crc >> 1) ^ 0x8408 : crc >> 1);
            }
            EXPECT_EQ(crc16x25(bytes), static_cast<std::uint16_t>(~crc))
                << "start " << start << " length " << length;
        }
    }
}

TEST(Framing, ThePeersVectors) {
    PYX_NEED_SHARED_DIAG();
    std::size_t checked = 0;
    for (const Vector& v : vectors()) {
        if (v.kind != "framing") continue;
        ++checked;
        SCOPED_TRACE(v.id);
        const Bytes wire = frame(v.bytes);
        const std::uint16_t crc = crc16x25(v.bytes);
        // Each record holds some of: the CRC, its two bytes as sent, the frame, the escaped bytes.
        const auto expected = [&](const char* key) {
            return v.expect.contains(key) ? v.expect[key].get<std::string>() : std::string();
        };
        if (!expected("crc16_le_hex").empty()) {
            const Bytes sent = {static_cast<std::uint8_t>(crc & 0xFF),
                                static_cast<std::uint8_t>(crc >> 8)};
            EXPECT_EQ(sent, fromHex(expected("crc16_le_hex")));
        }
        if (!expected("crc16").empty()) {
            EXPECT_EQ(crc, std::stoul(expected("crc16"), nullptr, 16));
        }
        if (!expected("hdlc_frame_hex").empty()) {
            EXPECT_EQ(wire, fromHex(expected("hdlc_frame_hex")));
        }
        if (v.expect.contains("escaped_hex")) {
            // The frame is the escaped packet, then the escaped CRC and the flag.
            const Bytes escaped = fromHex(v.expect["escaped_hex"].get<std::string>());
            EXPECT_EQ(escaped.size(), v.expect["escaped_len"].get<std::size_t>());
            ASSERT_GE(wire.size(), escaped.size());
            EXPECT_EQ(Bytes(wire.begin(), wire.begin() + static_cast<long>(escaped.size())),
                      escaped);
        }
        const Deframed back = deframe(wire);
        ASSERT_EQ(back.packets.size(), 1U);
        EXPECT_EQ(back.packets[0], v.bytes);
    }
    EXPECT_EQ(checked, 5U);  // v132, v139-v142
}

TEST(Framing, EveryFramedVectorDeframesToItsPacket) {
    PYX_NEED_SHARED_DIAG();
    std::size_t checked = 0;
    for (const Vector& v : vectors()) {
        if (v.frame.empty()) continue;
        ++checked;
        EXPECT_EQ(frame(v.packet), v.frame) << v.id;
        const Deframed back = deframe(v.frame);
        ASSERT_EQ(back.packets.size(), 1U) << v.id;
        EXPECT_EQ(back.packets[0], v.packet) << v.id;
    }
    EXPECT_GT(checked, 100U);
}

TEST(Framing, OurRequests) {
    const std::vector<std::pair<Bytes, Bytes>> requests = {
        {{0x00}, {0x00, 0x78, 0xF0, 0x7E}},
        {{0x7C}, {0x7C, 0x93, 0x49, 0x7E}},
        {{0x1D}, {0x1D, 0x1C, 0x3B, 0x7E}},
        {{0x60, 0x00}, {0x60, 0x00, 0x12, 0x6A, 0x7E}},
        {{0x60, 0x01}, {0x60, 0x01, 0x9B, 0x7B, 0x7E}},
        {{0x73, 0, 0, 0, 0x01, 0, 0, 0}, {0x73, 0, 0, 0, 0x01, 0, 0, 0, 0x61, 0x9D, 0x7E}},
        {{0x73, 0, 0, 0, 0x00, 0, 0, 0}, {0x73, 0, 0, 0, 0x00, 0, 0, 0, 0xDA, 0x81, 0x7E}},
        {{0x7D, 0x01}, {0x7D, 0x5D, 0x01, 0x72, 0x5E, 0x7E}},
        {{0x7D, 0x05, 0, 0, 0, 0, 0, 0}, {0x7D, 0x5D, 0x05, 0, 0, 0, 0, 0, 0, 0x74, 0x41, 0x7E}},
    };
    for (const auto& [packet, wire] : requests) {
        EXPECT_EQ(frame(packet), wire) << +packet[0];
        Bytes appended = {0xAA};
        appendFrame(packet, appended);
        EXPECT_EQ(appended, concat({{0xAA}, wire}));
    }
}

TEST(Deframer, RoundTripsPacketsWithFlagsAndEscapes) {
    const std::vector<Bytes> packets = awkwardPackets();
    for (const Bytes& p : packets) {
        const Bytes wire = frame(p);
        // Only the last byte is a flag; an escape is always followed by 5E or 5D.
        EXPECT_EQ(std::count(wire.begin(), wire.end(), 0x7E), 1);
        for (std::size_t i = 0; i + 1 < wire.size(); ++i)
            if (wire[i] == 0x7D) {
                EXPECT_TRUE(wire[i + 1] == 0x5E || wire[i + 1] == 0x5D);
            }
    }
    const Deframed back = deframe(framed(packets));
    EXPECT_EQ(back.packets, packets);
    EXPECT_EQ(back.counts.frames, packets.size());
    EXPECT_EQ(back.counts.badFrames, 0U);
    EXPECT_EQ(back.counts.empty, 0U);
    EXPECT_EQ(back.pending, 0U);
}

TEST(Deframer, PiecesOfEverySizeGiveTheSamePackets) {
    const std::vector<Bytes> packets = awkwardPackets();
    Bytes badCrc = frame(ascii("bad crc here"));
    badCrc[3] ^= 0x01;
    // Noise, a leading flag, good frames, a bad CRC, an escape right before a flag, a frame
    // cut short at the end.
    const Bytes stream = concat({ascii("noise}~"),
                                 {0x7E},
                                 framed(packets),
                                 badCrc,
                                 {0x01, 0x7D, 0x7E},
                                 frame(ascii("after")),
                                 {0x10, 0x7D}});
    const Deframed whole = deframe(stream);
    ASSERT_EQ(whole.packets.size(), packets.size() + 1);
    EXPECT_EQ(whole.packets.back(), ascii("after"));
    EXPECT_EQ(whole.counts.badFrames, 3U);  // the noise, the bad CRC, the broken escape
    EXPECT_EQ(whole.counts.empty, 1U);
    EXPECT_EQ(whole.pending, 1U);  // 0x10; the escape waits for its byte
    for (std::size_t piece = 1; piece <= stream.size(); ++piece) {
        const Deframed pieces = deframe(stream, piece);
        ASSERT_EQ(pieces.packets, whole.packets) << "pieces of " << piece;
        EXPECT_EQ(pieces.counts.frames, whole.counts.frames) << piece;
        EXPECT_EQ(pieces.counts.badFrames, whole.counts.badFrames) << piece;
        EXPECT_EQ(pieces.counts.empty, whole.counts.empty) << piece;
        EXPECT_EQ(pieces.counts.bytes, stream.size()) << piece;
        EXPECT_EQ(pieces.pending, whole.pending) << piece;
    }
}

TEST(Deframer, NoiseBeforeBetweenAndAfterFrames) {
    const Bytes one = ascii("\x10 first");
    const Bytes two = ascii("\x10 second");
    const Bytes three = ascii("\x10 third");
    // The stream starts inside a frame: everything up to the first flag is one bad frame.
    // Between frames, noise ending in a flag is one more; noise after the last frame waits
    // for a flag that does not come.
    const Bytes stream = concat({{0x12, 0x7D, 0x34, 0x56, 0x7E},
                                 frame(one),
                                 {0xFF, 0x00, 0x7D, 0x5E, 0x11, 0x7E},
                                 frame(two),
                                 frame(three),
                                 {0x01, 0x02, 0x03}});
    const Deframed got = deframe(stream);
    EXPECT_EQ(got.packets, (std::vector<Bytes>{one, two, three}));
    EXPECT_EQ(got.counts.badFrames, 2U);
    EXPECT_EQ(got.counts.frames, 3U);
    EXPECT_EQ(got.pending, 3U);
}

TEST(Deframer, ABadCrcIsSkippedAndTheNextFrameTaken) {
    Bytes bad = frame(ascii("\x10 damaged"));
    bad[2] ^= 0x40;
    const Bytes stream = concat({bad, frame(ascii("\x10 whole"))});
    const Deframed got = deframe(stream);
    EXPECT_EQ(got.packets, (std::vector<Bytes>{ascii("\x10 whole")}));
    EXPECT_EQ(got.counts.badFrames, 1U);
    EXPECT_EQ(got.counts.frames, 1U);
}

TEST(Deframer, AFrameRunIntoByNoiseIsLostAndTheNextTaken) {
    // No flag between the noise and the frame: both read as one frame, whose CRC fails.
    const Bytes stream =
        concat({{0x31, 0x32}, frame(ascii("\x10 lost")), frame(ascii("\x10 kept"))});
    const Deframed got = deframe(stream);
    EXPECT_EQ(got.packets, (std::vector<Bytes>{ascii("\x10 kept")}));
    EXPECT_EQ(got.counts.badFrames, 1U);
}

TEST(Deframer, LeadingFlagsGiveEmptyFramesThatAreSkipped) {
    const Bytes stream = concat({{0x7E}, frame(Bytes{0x00}), {0x7E, 0x7E}, frame(Bytes{0x7C})});
    const Deframed got = deframe(stream);
    EXPECT_EQ(got.packets, (std::vector<Bytes>{{0x00}, {0x7C}}));
    EXPECT_EQ(got.counts.empty, 3U);
    EXPECT_EQ(got.counts.badFrames, 0U);
}

TEST(Deframer, FramesShorterThanACommandAndItsCrcAreBad) {
    // One byte; two bytes; and an empty packet whose CRC (00 00) holds: no command byte.
    const Bytes stream = {0x01, 0x7E, 0x01, 0x02, 0x7E, 0x00, 0x00, 0x7E};
    const Deframed got = deframe(stream);
    EXPECT_TRUE(got.packets.empty());
    EXPECT_EQ(got.counts.badFrames, 3U);
    EXPECT_EQ(got.counts.frames, 0U);
}

TEST(Deframer, AFinalFrameCutShortIsPending) {
    const Bytes whole = frame(ascii("\x10 whole"));
    const Bytes cut = frame(ascii("\x10 cut short"));
    const Bytes stream = concat({whole, Bytes(cut.begin(), cut.end() - 4)});
    const Deframed got = deframe(stream);
    EXPECT_EQ(got.packets.size(), 1U);
    EXPECT_EQ(got.counts.badFrames, 0U);
    EXPECT_EQ(got.pending, cut.size() - 4);
}

TEST(Deframer, ResetForgetsAFrameBegun) {
    Deframer deframer;
    std::vector<Bytes> packets;
    const auto onPacket = [&](std::span<const std::uint8_t> p) {
        packets.emplace_back(p.begin(), p.end());
    };
    const Bytes wire = frame(ascii("\x10 whole"));
    deframer.feed(Bytes{0x55, 0x66, 0x7D}, onPacket);
    EXPECT_EQ(deframer.pending(), 2U);
    deframer.reset();
    EXPECT_EQ(deframer.pending(), 0U);
    deframer.feed(wire, onPacket);
    EXPECT_EQ(packets, (std::vector<Bytes>{ascii("\x10 whole")}));
    EXPECT_EQ(deframer.counts().badFrames, 0U);
}

TEST(Deframer, AStreamWithoutFlagsDoesNotGrowWithoutEnd) {
    Deframer deframer;
    std::size_t packets = 0;
    const auto onPacket = [&](std::span<const std::uint8_t>) { ++packets; };
    const Bytes noise(4096, 0x55);
    for (int i = 0; i < 100; ++i) {
        deframer.feed(noise, onPacket);
        EXPECT_LE(deframer.pending(), std::size_t{1} << 17);
    }
    deframer.feed(Bytes{0x7E}, onPacket);  // ends the overlong frame: bad
    deframer.feed(frame(ascii("\x10 after")), onPacket);
    EXPECT_EQ(packets, 1U);
    EXPECT_EQ(deframer.counts().badFrames, 1U);
    EXPECT_EQ(deframer.counts().frames, 1U);
}

TEST(Deframer, LargestPacketsPassInOnePieceAndInMany) {
    Bytes big(0xFFFF + 8);
    for (std::size_t i = 0; i < big.size(); ++i) big[i] = static_cast<std::uint8_t>(i * 13);
    const Bytes wire = frame(big);
    for (const std::size_t piece : {std::size_t{0}, std::size_t{1000}, std::size_t{7}}) {
        const Deframed got = deframe(wire, piece);
        ASSERT_EQ(got.packets.size(), 1U) << piece;
        EXPECT_EQ(got.packets[0], big);
    }
}

}  // namespace
}  // namespace pyx::diag::test
