// Collects what the settings report while a test runs, instead of printing it; the reporter that was
// set before comes back afterwards.
#pragma once

#include "settings/SettingsReport.h"

#include <mutex>
#include <ostream>
#include <string>
#include <vector>

struct ReportedMessage {
    std::string text;
    bool alert = false;

    bool operator==(const ReportedMessage& other) const { return text == other.text && alert == other.alert; }
};

inline std::ostream& operator<<(std::ostream& out, const ReportedMessage& message) {
    return out << (message.alert ? "[alert] " : "") << '"' << message.text << '"';
}

class ReportedMessages {
public:
    ReportedMessages() {
        Clear();
        m_previous = SetSettingsReporter(&Collect);
    }
    ~ReportedMessages() { SetSettingsReporter(m_previous); }
    ReportedMessages(const ReportedMessages&) = delete;
    ReportedMessages& operator=(const ReportedMessages&) = delete;

    std::vector<ReportedMessage> All() const {
        std::lock_guard<std::mutex> lock(Mutex());
        return Messages();
    }
    std::vector<std::string> Texts() const {
        std::vector<std::string> texts;
        for (const ReportedMessage& message : All())
            texts.push_back(message.text);
        return texts;
    }
    void Clear() {
        std::lock_guard<std::mutex> lock(Mutex());
        Messages().clear();
    }

private:
    // Writers on several threads report at once in the concurrency tests.
    static void Collect(const char* text, bool alert) {
        std::lock_guard<std::mutex> lock(Mutex());
        Messages().push_back(ReportedMessage{text, alert});
    }
    static std::mutex& Mutex() {
        static std::mutex mutex;
        return mutex;
    }
    static std::vector<ReportedMessage>& Messages() {
        static std::vector<ReportedMessage> messages;
        return messages;
    }

    SettingsReporter m_previous = nullptr;
};
