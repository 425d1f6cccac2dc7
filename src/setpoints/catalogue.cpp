// Lookups in the catalogue's tables, the names of store fields and the
// editor's tags.

#include "setpoints/catalogue.h"

namespace catalogue {

int lastChannel(Scope scope)
{
    switch (scope) {
    case Scope::Global: return 1;
    case Scope::All: return kChannels;
    case Scope::Alarm: return 200;
    case Scope::Control: return 100;
    case Scope::Analogue66: return 66;
    case Scope::Pid32: return 32;
    case Scope::Compressor: return 27;
    case Scope::Pressure: return 15;
    case Scope::Condenser: return 12;
    }
    return 0;
}

int Function::fieldCount() const
{
    int n = 0;
    for (short f : fields)
        n += f != kNoField;
    return n;
}

int Function::field(int subfunction) const
{
    if (subfunction < 0 || subfunction >= int(fields.size()))
        return kNoField;
    return fields[std::size_t(subfunction)];
}

int Function::subfunctionOf(int storeField) const
{
    if (storeField == kNoField)
        return -1;
    for (std::size_t i = 0; i < fields.size(); ++i)
        if (fields[i] == storeField)
            return int(i);
    return -1;
}

bool Function::appliesTo(int channel) const
{
    return channel >= 1 && channel <= (isGlobal() ? kChannels : lastChannel(scope));
}

const Function* findFunction(int number)
{
    for (const Function& f : functions())
        if (f.number == number)
            return &f;
    return nullptr;
}

namespace {

QString nameKey(const QString& name)
{
    QString key;
    for (QChar c : name)
        if (c.isLetterOrNumber())
            key += c.toLower();
    return key;
}

} // namespace

const Function* findFunctionByName(const QString& name)
{
    const QString key = nameKey(name);
    if (key.isEmpty())
        return nullptr;
    const Function* begins = nullptr;
    int beginning = 0;
    for (const Function& f : functions()) {
        const QString k = nameKey(QString::fromLatin1(f.name));
        if (k == key)
            return &f;
        if (k.startsWith(key)) {
            begins = &f;
            ++beginning;
        }
    }
    return beginning == 1 ? begins : nullptr;
}

FieldOwner findField(int field)
{
    FieldOwner owner;
    if (field == kNoField)
        return owner;
    for (const Function& f : functions()) {
        const int sub = f.subfunctionOf(field);
        if (sub >= 0) {
            owner.function = &f;
            owner.subfunction = sub;
            return owner;
        }
    }
    for (const UntaggedValue& u : untaggedValues()) {
        if (u.field == field) {
            owner.untagged = &u;
            owner.subfunction = u.subfunction;
            return owner;
        }
    }
    return owner;
}

const TimeGroup* timeGroupOf(int field)
{
    for (const TimeGroup& g : timeGroups())
        for (int i = 0; i < g.count; ++i)
            if (g.fields[std::size_t(i)] == field)
                return &g;
    return nullptr;
}

int replyRowOf(int field)
{
    const std::span<const short> order = replyOrderFields();
    for (std::size_t i = 0; i < order.size(); ++i)
        if (order[i] == field)
            return int(i);
    return -1;
}

QString fieldLabel(int field)
{
    switch (field) {
    case kChannelNumberField: return QStringLiteral("Channel Number");
    case kChannelTextField: return QStringLiteral("Channel Text");
    case kLoadShedOrderField: return QStringLiteral("Load Shed Order");
    default: break;
    }
    const FieldOwner owner = findField(field);
    if (owner.function) {
        const QString name = QString::fromLatin1(owner.function->name);
        if (owner.function->fieldCount() > 1)
            return name + QLatin1Char(' ') + QString::number(owner.subfunction + 1);
        return name;
    }
    if (owner.untagged)
        return QString::fromLatin1(owner.untagged->label);
    return QStringLiteral("Spare %1").arg(field);
}

QString fieldColumnName(int field)
{
    QString base;
    bool gap = false;
    for (QChar c : fieldLabel(field).toLower()) {
        if (c.isLetterOrNumber()) {
            if (gap && !base.isEmpty())
                base += QLatin1Char('_');
            base += c;
            gap = false;
        } else {
            gap = true;
        }
    }
    return QStringLiteral("f%1_").arg(field, 3, 10, QLatin1Char('0')) + base;
}

QString encodeTag(const Tag& t)
{
    auto fits = [](int v, int max) { return v >= 0 && v <= max; };
    if (!fits(t.function, 999) || !fits(t.subfunction, 9) || !fits(t.width, 9) || !fits(t.field, 999)
        || !fits(t.group, 9))
        return {};
    return QStringLiteral("%1%2%3%4%5")
        .arg(t.function, 3, 10, QLatin1Char('0'))
        .arg(t.subfunction)
        .arg(t.width)
        .arg(t.field, 3, 10, QLatin1Char('0'))
        .arg(t.group);
}

std::optional<Tag> decodeTag(const QString& text)
{
    if (text.size() != 9)
        return std::nullopt;
    for (QChar c : text)
        if (c < QLatin1Char('0') || c > QLatin1Char('9'))
            return std::nullopt;
    Tag t;
    t.function = text.left(3).toInt();
    t.subfunction = text.mid(3, 1).toInt();
    t.width = text.mid(4, 1).toInt();
    t.field = text.mid(5, 3).toInt();
    t.group = text.mid(8, 1).toInt();
    return t;
}

std::optional<Tag> tagFor(int function, int subfunction)
{
    const Function* f = findFunction(function);
    if (!f || f->field(subfunction) == kNoField)
        return std::nullopt;
    return Tag{f->number, subfunction, f->width, f->field(subfunction), f->group};
}

const Function* functionOfTag(const Tag& tag)
{
    const Function* f = findFunction(tag.function);
    if (!f || f->field(tag.subfunction) == kNoField || f->field(tag.subfunction) != tag.field
        || f->width != tag.width || f->group != tag.group)
        return nullptr;
    return f;
}

} // namespace catalogue
