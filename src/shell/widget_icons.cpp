#include "shell/widget_icons.h"

#include <QIconEngine>
#include <QPainter>
#include <QPainterPath>
#include <QtMath>

namespace {

// One colour per family of views, so the toolbar reads in groups.
QColor tileColour(const QString& key)
{
    if (key == "tlbccform1on")
        return QColor(0x5b, 0x67, 0x78); // connection
    if (key == "tlbchannelson" || key == "tlbloadshedon" || key == "tlbfronton")
        return QColor(0x1f, 0x7a, 0x72); // settings
    if (key == "tlbhistoryon" || key == "tlbpoweron" || key == "tlbalarmon")
        return QColor(0xb0, 0x6a, 0x10); // logs
    if (key == "tlbContents" || key == "tlbwth")
        return QColor(0x6b, 0x6b, 0x6b); // help
    return QColor(0x1d, 0x5f, 0xa8);     // live status and the program itself
}

void thermometer(QPainter& p, double cx, double top, double bottom, double r)
{
    QPainterPath stem;
    stem.addRoundedRect(QRectF(cx - r * 0.55, top, r * 1.1, bottom - top), r * 0.55, r * 0.55);
    p.drawPath(stem);
    p.drawEllipse(QPointF(cx, bottom), r, r);
}

void gauge(QPainter& p, const QRectF& box)
{
    p.drawArc(box, 200 * 16, -220 * 16);
    const QPointF c = box.center();
    const double angle = qDegreesToRadians(-40.0);
    p.drawLine(c, c + QPointF(std::cos(angle) * box.width() * 0.38, std::sin(angle) * box.width() * 0.38));
    p.drawEllipse(c, box.width() * 0.05, box.width() * 0.05);
}

void snowflake(QPainter& p, QPointF c, double r)
{
    for (int i = 0; i < 3; ++i) {
        const double a = qDegreesToRadians(90.0 + i * 60.0);
        const QPointF d(std::cos(a) * r, std::sin(a) * r);
        p.drawLine(c - d, c + d);
        for (double s : {-1.0, 1.0}) {
            const QPointF tip = c + d * s * 0.6;
            const double b1 = a + (s > 0 ? 0 : M_PI) + qDegreesToRadians(35.0);
            const double b2 = a + (s > 0 ? 0 : M_PI) - qDegreesToRadians(35.0);
            const double l = r * 0.35;
            p.drawLine(tip, tip + QPointF(std::cos(b1) * l, std::sin(b1) * l));
            p.drawLine(tip, tip + QPointF(std::cos(b2) * l, std::sin(b2) * l));
        }
    }
}

void roomGrid(QPainter& p, const QRectF& r)
{
    p.drawRect(r);
    p.drawLine(QPointF(r.center().x(), r.top()), QPointF(r.center().x(), r.bottom()));
    p.drawLine(QPointF(r.left(), r.center().y()), QPointF(r.center().x(), r.center().y()));
}

// Draws the glyph of key in a 100 x 100 box, white on the tile.
void glyph(QPainter& p, const QString& key)
{
    QPen pen(Qt::white, 7, Qt::SolidLine, Qt::RoundCap, Qt::RoundJoin);
    p.setPen(pen);
    p.setBrush(Qt::NoBrush);
    if (key == "tlbccform1on") { // leave the instrument: arrow out of a door
        p.drawPolyline(QPolygonF({{55, 22}, {25, 22}, {25, 78}, {55, 78}}));
        p.drawLine(QPointF(42, 50), QPointF(80, 50));
        p.drawPolyline(QPolygonF({{66, 36}, {80, 50}, {66, 64}}));
    } else if (key == "tlbchannelson") { // set points: three sliders
        for (int i = 0; i < 3; ++i) {
            const double x = 28 + i * 22;
            p.drawLine(QPointF(x, 20), QPointF(x, 80));
            const double y = QList<double>{62, 35, 52}[i];
            p.setBrush(Qt::white);
            p.drawRoundedRect(QRectF(x - 9, y - 6, 18, 12), 3, 3);
            p.setBrush(Qt::NoBrush);
        }
    } else if (key == "tlbloadshedon") { // load shedding: a bolt
        p.setBrush(Qt::white);
        p.drawPolygon(QPolygonF({{58, 14}, {28, 56}, {48, 56}, {40, 86}, {72, 42}, {52, 42}}));
    } else if (key == "tlbfronton") { // front panel: display and keys
        p.drawRoundedRect(QRectF(18, 18, 64, 64), 6, 6);
        p.drawRect(QRectF(28, 28, 44, 16));
        p.setBrush(Qt::white);
        for (int row = 0; row < 2; ++row)
            for (int col = 0; col < 3; ++col)
                p.drawEllipse(QPointF(34 + col * 16, 58 + row * 13), 3.5, 3.5);
    } else if (key == "tlbhistoryon") { // data log: a line graph
        p.drawPolyline(QPolygonF({{18, 20}, {18, 82}, {84, 82}}));
        p.drawPolyline(QPolygonF({{26, 66}, {42, 48}, {56, 58}, {78, 28}}));
    } else if (key == "tlbpoweron") { // power log: bars
        p.drawLine(QPointF(16, 82), QPointF(84, 82));
        p.setBrush(Qt::white);
        const QList<double> h{26, 46, 34, 56};
        for (int i = 0; i < 4; ++i)
            p.drawRect(QRectF(22 + i * 16, 82 - h[i], 8, h[i]));
    } else if (key == "tlbalarmon") { // alarms: a bell
        QPainterPath bell;
        bell.moveTo(24, 70);
        bell.cubicTo(32, 62, 28, 24, 50, 22);
        bell.cubicTo(72, 24, 68, 62, 76, 70);
        bell.closeSubpath();
        p.drawPath(bell);
        p.drawLine(QPointF(50, 14), QPointF(50, 22));
        p.drawArc(QRectF(42, 70, 16, 14), 180 * 16, 180 * 16);
    } else if (key == "tlbstatuson") { // temperatures: thermometer
        thermometer(p, 50, 16, 70, 12);
        for (int i = 0; i < 3; ++i)
            p.drawLine(QPointF(64, 26 + i * 12), QPointF(74, 26 + i * 12));
    } else if (key == "tlbstatusgon") { // temperatures in the room layout
        roomGrid(p, QRectF(16, 18, 68, 64));
        thermometer(p, 67, 56, 70, 5);
    } else if (key == "tlbmultiprobeson") { // several probes in one room
        p.drawRect(QRectF(16, 18, 68, 64));
        p.setBrush(Qt::white);
        for (QPointF c : {QPointF(34, 36), QPointF(66, 36), QPointF(34, 64), QPointF(66, 64), QPointF(50, 50)})
            p.drawEllipse(c, 5, 5);
    } else if (key == "tlbstatuspon") { // pressures: a gauge
        gauge(p, QRectF(14, 18, 72, 72));
    } else if (key == "tlbstatuspgon") { // pressures in the plant room layout
        roomGrid(p, QRectF(14, 16, 72, 68));
        gauge(p, QRectF(52, 52, 30, 30));
    } else if (key == "tlbbrumaleton") { // evaporator: frost
        snowflake(p, QPointF(50, 50), 34);
    } else if (key == "tlbContents") { // room contents: a list
        for (int i = 0; i < 4; ++i) {
            p.drawPoint(QPointF(24, 26 + i * 16));
            p.drawLine(QPointF(36, 26 + i * 16), QPointF(78, 26 + i * 16));
        }
    } else if (key == "tlbwth") { // what's this: question mark
        QFont f(QStringLiteral("DejaVu Sans"));
        f.setPixelSize(70);
        f.setBold(true);
        p.setFont(f);
        p.drawText(QRectF(0, 0, 100, 100), Qt::AlignCenter, QStringLiteral("?"));
    } else { // the program: frost over a thermometer
        snowflake(p, QPointF(42, 44), 26);
        pen.setWidth(6);
        p.setPen(pen);
        thermometer(p, 76, 40, 76, 8);
    }
}

class PaintedIcon : public QIconEngine {
public:
    explicit PaintedIcon(QString key) : m_key(std::move(key)) {}
    void paint(QPainter* painter, const QRect& rect, QIcon::Mode mode, QIcon::State) override
    {
        painter->save();
        painter->setRenderHint(QPainter::Antialiasing);
        painter->translate(rect.topLeft());
        painter->scale(rect.width() / 100.0, rect.height() / 100.0);
        QColor tile = tileColour(m_key);
        if (mode == QIcon::Disabled)
            tile = QColor(0xb8, 0xb8, 0xb8);
        else if (mode == QIcon::Active || mode == QIcon::Selected)
            tile = tile.lighter(115);
        painter->setPen(Qt::NoPen);
        painter->setBrush(tile);
        painter->drawRoundedRect(QRectF(3, 3, 94, 94), 18, 18);
        glyph(*painter, m_key);
        painter->restore();
    }
    QPixmap pixmap(const QSize& size, QIcon::Mode mode, QIcon::State state) override
    {
        QPixmap pm(size);
        pm.fill(Qt::transparent);
        QPainter p(&pm);
        paint(&p, QRect(QPoint(0, 0), size), mode, state);
        return pm;
    }
    QIconEngine* clone() const override { return new PaintedIcon(m_key); }

private:
    QString m_key;
};

} // namespace

QIcon q19Icon(const QString& key)
{
    return QIcon(new PaintedIcon(key));
}
