#pragma once

#include <QByteArray>
#include <QDateTime>

namespace sim {

// Decimal text right aligned in a field of the given width, blanks in front.
// A value too wide for its field keeps its last digits, as a fixed-width
// display would, so that a record never grows.
QByteArray num(qint64 value, int width);
// A sign and digits filling the width: "+00008" for 8 in 6.
QByteArray signedNum(qint64 value, int width);
// Text cut or padded with blanks behind to exactly width characters.
QByteArray fixed(const QByteArray& text, int width);
// "dd/mm/yyyy hh:mm:ss", the instrument's way of writing its clock.
QByteArray stamp(const QDateTime& t);

// A reply under construction, addressed by 1-based positions as the layout
// tables count them. Gaps stay blank.
class Layout {
public:
    explicit Layout(int length = 0) : m_text(length, ' ') {}
    void put(int pos, const QByteArray& text);
    void putNum(int pos, qint64 value, int width) { put(pos, number(value, width)); }
    // Numbers as a sign and zeros from now on.
    void setZeroPadded(bool on) { m_zeros = on; }
    QByteArray number(qint64 value, int width) const { return m_zeros ? signedNum(value, width) : num(value, width); }
    void putFlag(int pos, bool on) { put(pos, on ? "1" : "0"); }
    int length() const { return int(m_text.size()); }
    QByteArray text() const { return m_text; }

private:
    QByteArray m_text;
    bool m_zeros = false;
};

} // namespace sim
