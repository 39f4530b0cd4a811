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
    using Sink = std::function<void(std::string_view line)>;

    // Lines go to sink; the system log when none is given.
    explicit FaultReporter(Sink sink = {});

    // Says line under topic, unless it is the last line the topic said.
    void say(const std::string& topic, const std::string& line);
    // Forgets what topic said: its next line is said whatever it is.
    void clear(const std::string& topic);
    // Whether topic's last line is still standing.
    [[nodiscard]] bool saying(const std::string& topic) const;
    // Says line once for the life of the reporter.
    void once(const std::string& line);

  private:
    Sink sink_;
    std::map<std::string, std::string, std::less<>> last_;
    std::set<std::string, std::less<>> said_;
};

}  // namespace pyx::modem
