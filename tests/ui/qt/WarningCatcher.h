// Collects the Qt warnings issued while it lives (the model tester reports through them).
#pragma once

#include <QString>
#include <QStringList>
#include <QtGlobal>

namespace pyx::test {

class WarningCatcher {
  public:
    WarningCatcher() : previous_(qInstallMessageHandler(&WarningCatcher::handle)) {
        current() = this;
    }
    ~WarningCatcher() {
        qInstallMessageHandler(previous_);
        current() = nullptr;
    }
    WarningCatcher(const WarningCatcher&) = delete;
    WarningCatcher& operator=(const WarningCatcher&) = delete;

    [[nodiscard]] const QStringList& warnings() const { return warnings_; }

  private:
    static WarningCatcher*& current() {
        static WarningCatcher* catcher = nullptr;
        return catcher;
    }
    static void handle(QtMsgType type, const QMessageLogContext&, const QString& message) {
        if (type != QtDebugMsg && type != QtInfoMsg && current() != nullptr)
            current()->warnings_ << message;
    }

    QtMessageHandler previous_;
    QStringList warnings_;
};

}  // namespace pyx::test
