#include "platform/operator.h"

#include <cstdio>

QString Operator::Message::toText() const
{
    QString text = title + QStringLiteral(":");
    if (!lines.isEmpty())
        text += QLatin1Char(' ') + lines.join(QStringLiteral(" / "));
    return text;
}

Operator::Answer Operator::message(const QString& title, const QStringList& lines, Icon icon,
                                   Buttons buttons)
{
    return ask(Message{title, lines, icon, buttons});
}

Operator::Answer Operator::affirmative(Buttons buttons)
{
    switch (buttons) {
    case Buttons::Ok:
    case Buttons::OkCancel:
        return Answer::Ok;
    case Buttons::YesNo:
    case Buttons::YesNoCancel:
        return Answer::Yes;
    case Buttons::RetryCancel:
        return Answer::Retry;
    case Buttons::AbortRetryIgnore:
        return Answer::Ignore;
    }
    return Answer::Ok;
}

Operator::Answer Operator::negative(Buttons buttons)
{
    switch (buttons) {
    case Buttons::Ok:
        return Answer::Ok;
    case Buttons::OkCancel:
    case Buttons::YesNoCancel:
    case Buttons::RetryCancel:
        return Answer::Cancel;
    case Buttons::YesNo:
        return Answer::No;
    case Buttons::AbortRetryIgnore:
        return Answer::Abort;
    }
    return Answer::Cancel;
}

// ---------------------------------------------------------------------------

Operator::Answer ScriptedOperator::ask(const Message& message)
{
    m_messages.append(message);
    if (m_whileShowing)
        m_whileShowing(message);
    if (m_answers.isEmpty())
        return affirmative(message.buttons);
    return m_answers.takeFirst();
}

QString ScriptedOperator::openFileName(const QString&, const QString&, const QString&)
{
    return m_files.isEmpty() ? QString() : m_files.takeFirst();
}

QString ScriptedOperator::saveFileName(const QString&, const QString&, const QString&)
{
    return m_files.isEmpty() ? QString() : m_files.takeFirst();
}

std::optional<quint32> ScriptedOperator::chooseColour(quint32)
{
    return m_colours.isEmpty() ? std::nullopt : m_colours.takeFirst();
}

std::optional<Operator::FontChoice> ScriptedOperator::chooseFont(const FontChoice&)
{
    return m_fonts.isEmpty() ? std::nullopt : m_fonts.takeFirst();
}

void ScriptedOperator::setBusy(bool busy)
{
    if (busy) {
        ++m_busyDepth;
        ++m_busyCount;
    } else if (m_busyDepth > 0) {
        --m_busyDepth;
    }
}

QStringList ScriptedOperator::titles() const
{
    QStringList t;
    for (const Message& m : m_messages)
        t.append(m.title);
    return t;
}

// ---------------------------------------------------------------------------

Operator::Answer HeadlessOperator::ask(const Message& message)
{
    m_messages.append(message);
    std::fprintf(stderr, "%s\n", message.toText().toLocal8Bit().constData());
    std::fflush(stderr);
    if (message.buttons == Buttons::Ok)
        return Answer::Ok;
    return m_assumeYes ? affirmative(message.buttons) : negative(message.buttons);
}
