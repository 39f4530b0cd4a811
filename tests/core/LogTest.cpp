#include "core/Log.h"

#include <gtest/gtest.h>

#include <thread>
#include <vector>

#include "core/Format.h"

TEST(LineSinks, CaptureSeesWholeLinesFromConcurrentWriters) {
    pyx::CapturedLines captured(pyx::systemLogSink());
    std::vector<std::thread> writers;
    for (int t = 0; t < 4; ++t) {
        writers.emplace_back([t] {
            for (int i = 0; i < 200; ++i) pyx::systemLog(pyx::format("writer %d line %d", t, i));
        });
    }
    for (auto& w : writers) w.join();
    const auto lines = captured.lines();
    ASSERT_EQ(lines.size(), 800U);
    for (const auto& line : lines) EXPECT_EQ(line.rfind("writer ", 0), 0U) << line;
}

TEST(LineSinks, RedirectedFileReceivesWholeLines) {
    std::FILE* tmp = std::tmpfile();
    ASSERT_NE(tmp, nullptr);
    pyx::LineSink sink(tmp);
    sink.write("Received Valid Metric");
    sink.write("I dont care for events");
    std::rewind(tmp);
    char buf[128] = {};
    const auto n = std::fread(buf, 1, sizeof buf - 1, tmp);
    std::fclose(tmp);
    EXPECT_EQ(std::string(buf, n), "Received Valid Metric\nI dont care for events\n");
}

TEST(Format, PrintfStyle) {
    EXPECT_EQ(pyx::format("%2X", 0), " 0");
    EXPECT_EQ(pyx::format("%2X", 3952152), "3C4E18");
    EXPECT_EQ(pyx::format("%s: error=%d msg=%s", "-[VelkWrapper listen]", -1, "x"),
              "-[VelkWrapper listen]: error=-1 msg=x");
    const std::string longText(1000, 'a');
    EXPECT_EQ(pyx::format("%s", longText.c_str()), longText);
}
