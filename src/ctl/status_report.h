#pragma once

// What q19ctl status and q19ctl pressure print for one reply: as a table and
// as JSON. Pure: the reply texts, the instrument's version and the set
// points that shape the views come in; nothing is read from the line.

#include <QJsonObject>
#include <QList>
#include <QString>

struct StatusReport {
    QString id;
    QString version;        // the instrument's version text
    double versionNumber = 0; // the same as a number
    QString reply;          // "status"
    // Control kind (catalogue::kControlKindField) of channel n at index
    // n - 1; a channel past the end has no kind.
    QList<int> controlKinds;
};

struct PressureReport {
    QString id;
    QString version;
    double versionNumber = 0;
    QString presss;
    QString torvan;          // empty when not asked (below version 8)
    // Condenser kind (catalogue::kCondenserKindField) of condenser c at
    // index c; 4 is the variable condenser.
    QList<int> condenserKinds;
};

QString statusTable(const StatusReport& report);
QJsonObject statusJson(const StatusReport& report);
QString pressureTable(const PressureReport& report);
QJsonObject pressureJson(const PressureReport& report);
