#pragma once

#include "platform/line.h"

#include <QList>

// A line for tests. It records every write, delivers arrivals in whatever
// batches a test chooses, fails writes or opens on demand and reports line
// events, so that the receive side can be driven through every case.
class FakeLine : public Line {
    Q_OBJECT
public:
    explicit FakeLine(QObject* parent = nullptr);

    void setPortName(const QString& name) override { m_portName = name; }
    QString portName() const override { return m_portName; }
    bool setSettings(const LineSettings& settings, QString* error = nullptr) override;
    LineSettings settings() const override { return m_settings; }
    void setHandshaking(Handshaking h) override { m_handshaking = h; }
    Handshaking handshaking() const { return m_handshaking; }

    bool open(QString* error = nullptr) override;
    void close() override { m_open = false; }
    bool isOpen() const override { return m_open; }

    // Writes on a closed line fail and are not recorded, as on a real port.
    bool write(const QByteArray& bytes) override;
    void discardInput() override { ++m_discards; }
    void setDtr(bool on) override;
    bool dtr() const override { return m_dtr; }

    // --- driving the fake ---
    // Delivers bytes as one arrival (event 2), or cut into batches of n bytes.
    void deliver(const QByteArray& bytes);
    void deliverInBatches(const QByteArray& bytes, int n);
    void raiseEvent(int code) { emit lineEvent(code); }
    void failNextOpen(const QString& reason) { m_openFailure = reason; }
    void failWrites(bool fail) { m_failWrites = fail; }
    void refuseSettings(const QString& reason) { m_settingsFailure = reason; }

    // --- what happened ---
    // Every successful write, in order.
    const QList<QByteArray>& writes() const { return m_writes; }
    // All successful writes joined.
    QByteArray written() const;
    QByteArray lastWrite() const { return m_writes.isEmpty() ? QByteArray() : m_writes.last(); }
    void clearWrites() { m_writes.clear(); }
    int discards() const { return m_discards; }
    int opens() const { return m_opens; }
    // Every DTR level set, in order (the hang-up pulse shows up here).
    const QList<bool>& dtrHistory() const { return m_dtrHistory; }

private:
    QString m_portName;
    LineSettings m_settings;
    Handshaking m_handshaking = Handshaking::None;
    bool m_open = false;
    bool m_dtr = false;
    bool m_failWrites = false;
    QString m_openFailure;
    QString m_settingsFailure;
    QList<QByteArray> m_writes;
    QList<bool> m_dtrHistory;
    int m_discards = 0;
    int m_opens = 0;
};
