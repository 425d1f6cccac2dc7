#pragma once

#include "platform/operator.h"

class QWidget;

// The operator at the screen: real message boxes and dialogs.
class WidgetOperator : public Operator {
public:
    explicit WidgetOperator(QWidget* parent = nullptr) : m_parent(parent) {}
    void setParentWidget(QWidget* parent) { m_parent = parent; }

    Answer ask(const Message& message) override;
    QString openFileName(const QString& caption, const QString& dir, const QString& filter) override;
    QString saveFileName(const QString& caption, const QString& dir, const QString& filter) override;
    std::optional<quint32> chooseColour(quint32 initial) override;
    std::optional<FontChoice> chooseFont(const FontChoice& initial) override;
    void beep() override;
    void setBusy(bool busy) override;

private:
    QWidget* m_parent;
};
