// The --source texts: each form, and the one-line refusals for everything else.
#include <gtest/gtest.h>

#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
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
              "the modem's object path), replay:FILE, diag, diag:PORT (a tty or a character "
              "device, as /dev/ttyUSB0) or diag:FILE (a capture of the port: .qmdl, .mi2log, "
              ".bin)");
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

// A folder of its own, removed at the end.
class Folder {
  public:
    Folder() {
        std::string pattern =
            (std::filesystem::temp_directory_path() / "pyxsource-XXXXXX").string();
        path_ = ::mkdtemp(pattern.data());
    }
    ~Folder() {
        std::error_code ignored;
        std::filesystem::remove_all(path_, ignored);
    }
    Folder(const Folder&) = delete;
    Folder& operator=(const Folder&) = delete;
    [[nodiscard]] std::string file(const std::string& name) const {
        return (path_ / name).string();
    }
    [[nodiscard]] std::string path() const { return path_.string(); }

  private:
    std::filesystem::path path_;
};

TEST(SourceChoice, DiagAloneFindsThePort) {
    const SourceChoice choice = parseSource("diag");
    EXPECT_EQ(choice.kind, SourceChoice::Kind::Diag);
    EXPECT_EQ(choice.file, "");
    EXPECT_FALSE(choice.capture);
    EXPECT_TRUE(pyx::sources::isLiveDiag(choice));
}

TEST(SourceChoice, DiagWithACharacterDeviceIsThatPort) {
    const SourceChoice choice = parseSource("diag:/dev/null");  // a character device
    EXPECT_EQ(choice.kind, SourceChoice::Kind::Diag);
    EXPECT_EQ(choice.file, "/dev/null");
    EXPECT_FALSE(choice.capture);
    EXPECT_EQ(choice.text, "diag:/dev/null");
}

TEST(SourceChoice, DiagWithAPortNotThereYetUnderDevIsAPortToWaitFor) {
    const SourceChoice choice = parseSource("diag:/dev/ttyUSB-pyxon-absent");
    EXPECT_EQ(choice.kind, SourceChoice::Kind::Diag);
    EXPECT_EQ(choice.file, "/dev/ttyUSB-pyxon-absent");
    EXPECT_FALSE(choice.capture);
}

TEST(SourceChoice, DiagWithARegularFileIsACaptureToPlay) {
    const Folder folder;
    const std::string file = folder.file("drive.qmdl");
    std::ofstream(file) << "~";
    const SourceChoice choice = parseSource("diag:" + file);
    EXPECT_EQ(choice.kind, SourceChoice::Kind::Diag);
    EXPECT_EQ(choice.file, file);
    EXPECT_TRUE(choice.capture);
    EXPECT_FALSE(pyx::sources::isLiveDiag(choice));
}

TEST(SourceChoice, DiagRefusalsAreOneLineEach) {
    const Folder folder;
    EXPECT_EQ(refusal("diag:"),
              "--source diag: names no port or file; example: diag:/dev/ttyUSB0 or "
              "diag:drive.qmdl");
    const std::string missing = folder.file("none.qmdl");
    EXPECT_EQ(refusal("diag:" + missing),
              "--source diag:" + missing +
                  ": no such file (a capture must exist; a port under /dev/ that is not there "
                  "yet is waited for)");
    const std::string directory = refusal("diag:" + folder.path());
    EXPECT_EQ(directory.find("--source diag:" + folder.path() + ": is a directory; expected sim"),
              0U)
        << directory;
    EXPECT_NE(directory.find("diag:FILE"), std::string::npos) << directory;
    for (const std::string& line : {refusal("diag:"), refusal("diag:" + missing), directory})
        EXPECT_EQ(line.find('\n'), std::string::npos) << line;
    EXPECT_NE(refusal("diagnose").find("expected sim"), std::string::npos);
}

TEST(SourceChoice, DiagCaptureThatIsADirectoryIsRefusedByTheFactoryToo) {
    const Folder folder;
    pyx::sources::SourceOptions options;
    options.choice.kind = SourceChoice::Kind::Diag;
    options.choice.capture = true;
    options.choice.file = folder.path();
    try {
        static_cast<void>(pyx::sources::makeTransport(options));
        FAIL() << "accepted a directory";
    } catch (const SourceError& e) {
        EXPECT_EQ(std::string(e.what()),
                  "--source diag:" + folder.path() + ": is a directory, not a capture");
    }
}

TEST(SourceChoice, QmdlIsForALiveDiagSourceOnly) {
    const Folder folder;
    const std::string capture = folder.file("drive.qmdl");
    std::ofstream(capture) << "~";
    for (const std::string& text :
         {std::string("sim"), std::string("replay:x.pyxrec"), "diag:" + capture}) {
        pyx::sources::SourceOptions options;
        options.choice = parseSource(text);
        options.qmdlFile = "kept.qmdl";
        try {
            static_cast<void>(pyx::sources::makeTransport(options));
            ADD_FAILURE() << text << " took --qmdl";
        } catch (const SourceError& e) {
            EXPECT_EQ(std::string(e.what()),
                      "--qmdl kept.qmdl: only with a live diag source (--source diag or "
                      "diag:PORT), not with --source " +
                          text);
        }
    }
}

TEST(SourceChoice, HelpGivesEverySourceFormWithAnExample) {
    const std::string help(pyx::sources::sourceHelp());
    EXPECT_EQ(help.find("Sources (--source):\n  sim            the built-in"), 0U);
    for (const char* text :
         {"  modem:N        ", "  replay:FILE    ", "  diag           ", "  diag:PORT      ",
          "  diag:FILE      ", "example: --source diag --qmdl drive.qmdl\n",
          "example: --source diag:/dev/ttyUSB0\n", "example: --source diag:drive.qmdl --speed 0\n"})
        EXPECT_NE(help.find(text), std::string::npos) << text;
    EXPECT_EQ(pyx::sources::sourceFormNames(),
              "sim, modem, modem:N, replay:FILE, diag, diag:PORT or diag:FILE");
}

TEST(SourceChoice, SimRefusesASpeedThatIsNotPositive) {
    pyx::sources::SourceOptions options;
    options.speed = 0;
    EXPECT_THROW(static_cast<void>(pyx::sources::makeTransport(options)), SourceError);
    options.speed = 2;
    EXPECT_NE(pyx::sources::makeTransport(options), nullptr);
}

}  // namespace
