#pragma once

#include <QList>
#include <QString>
#include <QStringList>
#include <functional>
#include <optional>

// What the program asks of the person at the screen: message boxes,
// confirmations, file, colour and font choices, a beep, a busy pointer.
// Engines talk to an Operator; only the widget one shows anything.
class Operator {
public:
    enum class Icon { None, Information, Exclamation, Critical, Question };
    enum class Buttons { Ok, OkCancel, YesNo, YesNoCancel, RetryCancel, AbortRetryIgnore };
    enum class Answer { Ok, Cancel, Yes, No, Retry, Abort, Ignore };

    struct Message {
        QString title;
        QStringList lines;
        Icon icon = Icon::None;
        Buttons buttons = Buttons::Ok;
        // "Title: line / line", the form used on a terminal and in test output.
        QString toText() const;
    };

    struct FontChoice {
        QString family;
        double pointSize = 10;
        bool bold = false;
        bool italic = false;
        bool operator==(const FontChoice&) const = default;
    };

    virtual ~Operator() = default;

    virtual Answer ask(const Message& message) = 0;
    // Shorthand for the common case.
    Answer message(const QString& title, const QStringList& lines, Icon icon = Icon::None,
                   Buttons buttons = Buttons::Ok);

    // Empty text when the operator cancels.
    virtual QString openFileName(const QString& caption, const QString& dir,
                                 const QString& filter) = 0;
    virtual QString saveFileName(const QString& caption, const QString& dir,
                                 const QString& filter) = 0;
    // Colours as 24-bit numbers in blue, green, red order.
    virtual std::optional<quint32> chooseColour(quint32 initial) = 0;
    virtual std::optional<FontChoice> chooseFont(const FontChoice& initial) = 0;

    virtual void beep() = 0;
    // Hourglass pointer on and off.
    virtual void setBusy(bool busy) = 0;

    // The answer a button set gives when the operator agrees.
    static Answer affirmative(Buttons buttons);
    // The answer it gives when the operator backs out.
    static Answer negative(Buttons buttons);
};

// For tests: records every message and answers from queues. An empty queue
// answers the affirmative button (OK), an empty file queue cancels.
class ScriptedOperator : public Operator {
public:
    Answer ask(const Message& message) override;
    QString openFileName(const QString& caption, const QString& dir, const QString& filter) override;
    QString saveFileName(const QString& caption, const QString& dir, const QString& filter) override;
    std::optional<quint32> chooseColour(quint32 initial) override;
    std::optional<FontChoice> chooseFont(const FontChoice& initial) override;
    void beep() override { ++m_beeps; }
    void setBusy(bool busy) override;

    void queueAnswer(Answer a) { m_answers.append(a); }
    void queueFile(const QString& path) { m_files.append(path); }
    void queueColour(std::optional<quint32> c) { m_colours.append(c); }
    void queueFont(std::optional<FontChoice> f) { m_fonts.append(f); }

    const QList<Message>& messages() const { return m_messages; }
    Message last() const { return m_messages.isEmpty() ? Message{} : m_messages.last(); }
    QStringList titles() const;
    void clear() { m_messages.clear(); }
    int beeps() const { return m_beeps; }
    bool busy() const { return m_busyDepth > 0; }
    // How often the pointer went busy.
    int busyCount() const { return m_busyCount; }
    // Called while a message stands, as the real box lets events run beneath it.
    void setWhileShowing(std::function<void(const Message&)> f) { m_whileShowing = std::move(f); }

private:
    QList<Message> m_messages;
    QList<Answer> m_answers;
    QStringList m_files;
    QList<std::optional<quint32>> m_colours;
    QList<std::optional<FontChoice>> m_fonts;
    std::function<void(const Message&)> m_whileShowing;
    int m_beeps = 0;
    int m_busyDepth = 0;
    int m_busyCount = 0;
};

// For programs without windows: messages go to stderr as "Title: line / line",
// confirmations are answered OK only when the user said so beforehand.
class HeadlessOperator : public Operator {
public:
    explicit HeadlessOperator(bool assumeYes = false) : m_assumeYes(assumeYes) {}
    Answer ask(const Message& message) override;
    QString openFileName(const QString&, const QString&, const QString&) override { return {}; }
    QString saveFileName(const QString&, const QString&, const QString&) override { return {}; }
    std::optional<quint32> chooseColour(quint32) override { return std::nullopt; }
    std::optional<FontChoice> chooseFont(const FontChoice&) override { return std::nullopt; }
    void beep() override {}
    void setBusy(bool) override {}

    // Messages shown so far; a command fails when one of them was a failure.
    const QList<Message>& messages() const { return m_messages; }

private:
    bool m_assumeYes;
    QList<Message> m_messages;
};
