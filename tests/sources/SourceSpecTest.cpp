// The --source texts: each form, and the one-line refusals for everything else.
#include <gtest/gtest.h>

#include <string>

#include "sources/Source.h"

namespace {

using pyx::sources::parseSourceSpec;
using pyx::sources::SourceSpec;
using pyx::sources::SourceSpecError;

std::string refusal(const std::string& text) {
    try {
        static_cast<void>(parseSourceSpec(text));
    } catch (const SourceSpecError& e) {
        return e.what();
    }
    return "(accepted)";
}

TEST(SourceSpec, SimIsTheSimulatedBaseband) {
    const SourceSpec spec = parseSourceSpec("sim");
    EXPECT_EQ(spec.kind, SourceSpec::Kind::Sim);
    EXPECT_EQ(spec.text, "sim");
}

TEST(SourceSpec, ModemAloneIsTheFirstModem) {
    const SourceSpec spec = parseSourceSpec("modem");
    EXPECT_EQ(spec.kind, SourceSpec::Kind::Modem);
    EXPECT_FALSE(spec.modemIndex);
}

TEST(SourceSpec, ModemWithANumberNamesTheModemPath) {
    const SourceSpec spec = parseSourceSpec("modem:12");
    EXPECT_EQ(spec.kind, SourceSpec::Kind::Modem);
    EXPECT_EQ(spec.modemIndex, 12U);
    EXPECT_EQ(spec.text, "modem:12");
}

TEST(SourceSpec, ReplayNamesItsFile) {
    const SourceSpec spec = parseSourceSpec("replay:/tmp/a drive.pyxrec");
    EXPECT_EQ(spec.kind, SourceSpec::Kind::Replay);
    EXPECT_EQ(spec.file, "/tmp/a drive.pyxrec");
}

TEST(SourceSpec, UnknownTextNamesTheForms) {
    EXPECT_EQ(refusal("simulator"),
              "--source 'simulator': expected sim, modem, modem:N (N the number at the end of "
              "the modem's object path) or replay:FILE");
    EXPECT_NE(refusal("").find("expected sim, modem"), std::string::npos);
}

TEST(SourceSpec, ModemNumberMustBeANumber) {
    EXPECT_NE(refusal("modem:x").find("'x' is not a modem number"), std::string::npos);
    EXPECT_NE(refusal("modem:").find("'' is not a modem number"), std::string::npos);
    EXPECT_NE(refusal("modem:-1").find("is not a modem number"), std::string::npos);
    EXPECT_NE(refusal("modem:1x").find("is not a modem number"), std::string::npos);
}

TEST(SourceSpec, ReplayNeedsAFile) {
    EXPECT_NE(refusal("replay:").find("names no file"), std::string::npos);
}

TEST(SourceSpec, SimRefusesASpeedThatIsNotPositive) {
    pyx::sources::SourceOptions options;
    options.speed = 0;
    EXPECT_THROW(static_cast<void>(pyx::sources::makeTransport(options)), SourceSpecError);
    options.speed = 2;
    EXPECT_NE(pyx::sources::makeTransport(options), nullptr);
}

}  // namespace
