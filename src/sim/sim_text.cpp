#include "sim/sim_text.h"

namespace sim {

QByteArray num(qint64 value, int width)
{
    QByteArray digits = QByteArray::number(value);
    if (digits.size() > width)
        return digits.right(width);
    return QByteArray(width - digits.size(), ' ') + digits;
}

QByteArray signedNum(qint64 value, int width)
{
    QByteArray digits = QByteArray::number(value < 0 ? -value : value);
    const int room = width - 1;
    if (digits.size() > room)
        digits = digits.right(room);
    return (value < 0 ? "-" : "+") + QByteArray(room - digits.size(), '0') + digits;
}

QByteArray fixed(const QByteArray& text, int width)
{
    if (text.size() >= width)
        return text.left(width);
    return text + QByteArray(width - text.size(), ' ');
}

QByteArray stamp(const QDateTime& t)
{
    return t.toString(QStringLiteral("dd/MM/yyyy hh:mm:ss")).toLatin1();
}

void Layout::put(int pos, const QByteArray& text)
{
    const int end = pos - 1 + int(text.size());
    if (end > m_text.size())
        m_text.append(QByteArray(end - m_text.size(), ' '));
    m_text.replace(pos - 1, text.size(), text);
}

} // namespace sim
