// The --source texts: each form, and the one-line refusals for everything else.
#include <gtest/gtest.h>

#include <string>

#include "sources/Source.h"

namespace {

using pyx::sources::parseSource;
using pyx::sources::SourceChoice;
using pyx::sources::SourceError;

std::string refusal(const std::string& text) {
    try {
        static_cast<void>(parseSource(text));
    } catch (const SourceError& e) {
        return e.what();
    }
    return "(accepted)";
}

TEST(SourceChoice, SimIsTheSimulatedBaseband) {
    const SourceChoice choice = parseSource("sim");
    EXPECT_EQ(choice.kind, SourceChoice::Kind::Sim);
    EXPECT_EQ(choice.text, "sim");
}

TEST(SourceChoice, ModemAloneIsTheFirstModem) {
    const SourceChoice choice = parseSource("modem");
    EXPECT_EQ(choice.kind, SourceChoice::Kind::Modem);
    EXPECT_FALSE(choice.modemIndex);
}

TEST(SourceChoice, ModemWithANumberNamesTheModemPath) {
    const SourceChoice choice = parseSource("modem:12");
    EXPECT_EQ(choice.kind, SourceChoice::Kind::Modem);
    EXPECT_EQ(choice.modemIndex, 12U);
    EXPECT_EQ(choice.text, "modem:12");
}

TEST(SourceChoice, ReplayNamesItsFile) {
    const SourceChoice choice = parseSource("replay:/tmp/a drive.pyxrec");
    EXPECT_EQ(choice.kind, SourceChoice::Kind::Replay);
    EXPECT_EQ(choice.file, "/tmp/a drive.pyxrec");
}

TEST(SourceChoice, UnknownTextNamesTheForms) {
    EXPECT_EQ(refusal("simulator"),
              "--source 'simulator': expected sim, modem, modem:N (N the number at the end of "
              "the modem's object path) or replay:FILE");
    EXPECT_NE(refusal("").find("expected sim, modem"), std::string::npos);
}

TEST(SourceChoice, ModemNumberMustBeANumber) {
    EXPECT_NE(refusal("modem:x").find("'x' is not a modem number"), std::string::npos);
    EXPECT_NE(refusal("modem:").find("'' is not a modem number"), std::string::npos);
    EXPECT_NE(refusal("modem:-1").find("is not a modem number"), std::string::npos);
    EXPECT_NE(refusal("modem:1x").find("is not a modem number"), std::string::npos);
}

TEST(SourceChoice, ReplayNeedsAFile) {
    EXPECT_NE(refusal("replay:").find("names no file"), std::string::npos);
}

TEST(SourceChoice, SimRefusesASpeedThatIsNotPositive) {
    pyx::sources::SourceOptions options;
    options.speed = 0;
    EXPECT_THROW(static_cast<void>(pyx::sources::makeTransport(options)), SourceError);
    options.speed = 2;
    EXPECT_NE(pyx::sources::makeTransport(options), nullptr);
}

}  // namespace
