// A recording file that cannot be used as asked: what() is one line naming the file and what
// is wrong, e.g. "drive.pyxrec: not a Pyxon recording (file is not a database)".
#pragma once

#include <cstdint>
#include <stdexcept>
#include <string>

namespace pyx::recordings {

class RecordingError : public std::runtime_error {
  public:
    enum class Kind {
        Missing,        // no such file
        NotAFile,       // a directory or other non-regular file
        NotARecording,  // not SQLite, or SQLite without our marks
        NewerFormat,    // written by a later version of the format
        Damaged,        // truncated or corrupt; eventsRead says how many events read before
        Exists,         // a new recording would overwrite a file
        Unwritable,     // cannot be created or written
    };

    RecordingError(Kind kind, std::string file, const std::string& what,
                   std::uint64_t eventsRead = 0)
        : std::runtime_error(file + ": " + what),
          kind_(kind),
          file_(std::move(file)),
          eventsRead_(eventsRead) {}

    [[nodiscard]] Kind kind() const { return kind_; }
    [[nodiscard]] const std::string& file() const { return file_; }
    // For Damaged: the events read (and handed out) before the damage.
    [[nodiscard]] std::uint64_t eventsRead() const { return eventsRead_; }

  private:
    Kind kind_;
    std::string file_;
    std::uint64_t eventsRead_;
};

}  // namespace pyx::recordings
