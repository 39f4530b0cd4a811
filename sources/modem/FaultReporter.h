// Says each fault of a long-running source once, not once per poll: a topic ("service",
// "modem", "setup"...) keeps the last line it said, and a line is said again only after the
// topic has said something else or been cleared.
#pragma once

#include <functional>
#include <map>
#include <set>
#include <string>
#include <string_view>

namespace pyx::modem {

class FaultReporter {
  public:
    // Lines go to the system log.
    FaultReporter() = default;

    // Says line under topic, unless it is the last line the topic said.
    void say(const std::string& topic, const std::string& line);
    // Forgets what topic said: its next line is said whatever it is.
    void clear(const std::string& topic);
    // Says line once for the life of the reporter. Lines that differ only in their numbers
    // (the value a field was given) are one fault, said with the first value; after
    // kOnceLimit faults, one line says that further ones are not shown.
    void once(const std::string& line);

    static constexpr std::size_t kOnceLimit = 256;

  private:
    std::map<std::string, std::string, std::less<>> last_;
    std::set<std::string, std::less<>> said_;
    bool full_ = false;
};

}  // namespace pyx::modem
