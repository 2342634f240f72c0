#include "krsettings.h"

#include <QHash>
#include <QLocale>
#include <QXmlStreamReader>
#include <QXmlStreamWriter>

#include <cmath>
#include <cstring>
#include <vector>

// Text form, one element per value in key order:
//   <settings version="1">
//    <bool key="A">true</bool>
//    <int key="B">3</int>
//    <float key="C">0.1</float>
//    <string key="D">text</string>
//    <settings key="E">...</settings>
//   </settings>
// The text is pure ASCII (other characters become character references) so it survives any
// 8-bit codec a file or clipboard path may use. Keys and strings holding characters XML cannot
// carry (control characters, lone surrogates, U+FFFE/U+FFFF) are written as base64 of their
// UTF-16LE code units: key-base64="..." and <string ... encoding="base64">.
// Floats use the shortest text that reads back to the same bits; -0, infinities and NaNs
// (with their payload) have names of their own.

namespace {

const int kMaxDepth = 256;
const int kMaxTextLength = 64 * 1024 * 1024;
const quint64 kCanonicalNaN = Q_UINT64_C(0x7ff8000000000000);

const QString kSettingsTag = QStringLiteral("settings");
const QString kBoolTag = QStringLiteral("bool");
const QString kIntTag = QStringLiteral("int");
const QString kFloatTag = QStringLiteral("float");
const QString kStringTag = QStringLiteral("string");
const QString kKeyAttr = QStringLiteral("key");
const QString kKeyBase64Attr = QStringLiteral("key-base64");
const QString kEncodingAttr = QStringLiteral("encoding");
const QString kVersionAttr = QStringLiteral("version");
const QString kBase64 = QStringLiteral("base64");

quint64 doubleBits(double v)
{
    quint64 bits;
    std::memcpy(&bits, &v, sizeof bits);
    return bits;
}

double bitsToDouble(quint64 bits)
{
    double v;
    std::memcpy(&v, &bits, sizeof v);
    return v;
}

// True when text holds a character that XML 1.0 cannot carry, raw or as a reference.
bool needsBase64(const QString& text)
{
    const int n = text.size();
    const ushort* p = text.utf16();
    for (int i = 0; i < n; ++i) {
        const ushort c = p[i];
        if (c < 0x20) {
            if (c != 0x9 && c != 0xA && c != 0xD)
                return true;
        } else if (c >= 0xD800 && c <= 0xDBFF) {
            if (i + 1 >= n || p[i + 1] < 0xDC00 || p[i + 1] > 0xDFFF)
                return true;
            ++i;
        } else if (c >= 0xDC00 && c <= 0xDFFF) {
            return true;
        } else if (c == 0xFFFE || c == 0xFFFF) {
            return true;
        }
    }
    return false;
}

QString toBase64(const QString& text)
{
    QByteArray bytes;
    bytes.resize(text.size() * 2);
    for (int i = 0; i < text.size(); ++i) {
        const ushort c = text.at(i).unicode();
        bytes[2 * i] = char(c & 0xff);
        bytes[2 * i + 1] = char(c >> 8);
    }
    return QString::fromLatin1(bytes.toBase64());
}

bool fromBase64(const QString& text, QString* out)
{
    const QByteArray::FromBase64Result r = QByteArray::fromBase64Encoding(
        text.toLatin1(), QByteArray::Base64Encoding | QByteArray::AbortOnBase64DecodingErrors);
    if (!r || r.decoded.size() % 2 != 0)
        return false;
    const QByteArray& bytes = r.decoded;
    QString s(bytes.size() / 2, Qt::Uninitialized);
    for (int i = 0; i < s.size(); ++i)
        s[i] = QChar(ushort(uchar(bytes[2 * i]) | (uchar(bytes[2 * i + 1]) << 8)));
    *out = s;
    return true;
}

QString floatToText(double v)
{
    if (std::isnan(v)) {
        const quint64 bits = doubleBits(v);
        if (bits == kCanonicalNaN)
            return QStringLiteral("nan");
        return QStringLiteral("nan:%1").arg(bits, 16, 16, QLatin1Char('0'));
    }
    if (std::isinf(v))
        return v > 0 ? QStringLiteral("inf") : QStringLiteral("-inf");
    if (v == 0.0 && std::signbit(v))
        return QStringLiteral("-0");
    return QString::number(v, 'g', QLocale::FloatingPointShortest);
}

bool isDigit(QChar c)
{
    return c >= QLatin1Char('0') && c <= QLatin1Char('9');
}

// -?digits
bool isPlainInt(const QString& t)
{
    int i = 0;
    if (i < t.size() && t.at(i) == QLatin1Char('-'))
        ++i;
    if (i >= t.size())
        return false;
    for (; i < t.size(); ++i) {
        if (!isDigit(t.at(i)))
            return false;
    }
    return true;
}

// -?digits(.digits)?([eE][+-]?digits)?
bool isPlainDecimal(const QString& t)
{
    const int n = t.size();
    int i = 0;
    auto digits = [&]() {
        const int start = i;
        while (i < n && isDigit(t.at(i)))
            ++i;
        return i > start;
    };
    if (i < n && t.at(i) == QLatin1Char('-'))
        ++i;
    if (!digits())
        return false;
    if (i < n && t.at(i) == QLatin1Char('.')) {
        ++i;
        if (!digits())
            return false;
    }
    if (i < n && (t.at(i) == QLatin1Char('e') || t.at(i) == QLatin1Char('E'))) {
        ++i;
        if (i < n && (t.at(i) == QLatin1Char('+') || t.at(i) == QLatin1Char('-')))
            ++i;
        if (!digits())
            return false;
    }
    return i == n;
}

bool textToFloat(const QString& t, double* out)
{
    if (t == QLatin1String("nan")) {
        *out = bitsToDouble(kCanonicalNaN);
        return true;
    }
    if (t == QLatin1String("inf") || t == QLatin1String("-inf")) {
        *out = t.startsWith(QLatin1Char('-')) ? -HUGE_VAL : HUGE_VAL;
        return true;
    }
    if (t.startsWith(QLatin1String("nan:"))) {
        const QString hex = t.mid(4);
        if (hex.size() != 16)
            return false;
        bool ok = false;
        const quint64 bits = hex.toULongLong(&ok, 16);
        if (!ok || !std::isnan(bitsToDouble(bits)))
            return false;
        *out = bitsToDouble(bits);
        return true;
    }
    if (!isPlainDecimal(t))
        return false;
    bool ok = false;
    const double v = t.toDouble(&ok);
    if (!ok)
        return false;
    *out = v;
    return true;
}

// Replaces every non-ASCII character and every raw carriage return (which XML would read back
// as a line feed) by a character reference. Only text and attribute values can hold such
// characters, and a reference is valid in both.
QString asciiOnly(const QString& xml)
{
    const int n = xml.size();
    const ushort* p = xml.utf16();
    int first = 0;
    while (first < n && p[first] < 0x80 && p[first] != '\r')
        ++first;
    if (first == n)
        return xml;
    QString out;
    out.reserve(n + n / 8 + 16);
    out.append(xml.constData(), first);
    for (int i = first; i < n; ++i) {
        const ushort c = p[i];
        if (c < 0x80 && c != '\r') {
            out.append(QChar(c));
            continue;
        }
        uint code = c;
        if (QChar::isHighSurrogate(c) && i + 1 < n && QChar::isLowSurrogate(p[i + 1])) {
            code = QChar::surrogateToUcs4(c, p[i + 1]);
            ++i;
        }
        out.append(QLatin1String("&#x"));
        out.append(QString::number(code, 16).toUpper());
        out.append(QLatin1Char(';'));
    }
    return out;
}

} // namespace

struct KrSettings::Private
{
    struct Entry
    {
        QString key;
        ValueType type = Invalid;
        bool b = false;
        int i = 0;
        double f = 0.0;
        QString s;
        // Nested records live on the heap so pointers handed out stay valid as keys are added.
        std::unique_ptr<KrSettings> child;
    };

    std::vector<Entry> entries;
    QHash<QString, int> index;

    int find(const QString& key) const { return index.value(key, -1); }

    // The entry under key, made at the end when missing. A replaced value keeps its position.
    Entry& slot(const QString& key)
    {
        const int at = find(key);
        if (at >= 0)
            return entries[size_t(at)];
        index.insert(key, int(entries.size()));
        entries.emplace_back();
        entries.back().key = key;
        return entries.back();
    }

    static void resetValue(Entry& e, ValueType type)
    {
        if (type != Settings)
            e.child.reset();
        if (type != String)
            e.s.clear();
        e.type = type;
    }

    void copyFrom(const Private& other)
    {
        entries.clear();
        entries.reserve(other.entries.size());
        for (const Entry& src : other.entries) {
            entries.emplace_back();
            Entry& e = entries.back();
            e.key = src.key;
            e.type = src.type;
            e.b = src.b;
            e.i = src.i;
            e.f = src.f;
            e.s = src.s;
            if (src.child)
                e.child.reset(new KrSettings(*src.child));
        }
        index = other.index;
    }

    void write(QXmlStreamWriter& w) const;
    bool read(QXmlStreamReader& r, int depth);
};

namespace {

void writeKey(QXmlStreamWriter& w, const QString& key)
{
    if (needsBase64(key))
        w.writeAttribute(kKeyBase64Attr, toBase64(key));
    else
        w.writeAttribute(kKeyAttr, key);
}

} // namespace

void KrSettings::Private::write(QXmlStreamWriter& w) const
{
    for (const Entry& e : entries) {
        switch (e.type) {
        case Bool:
            w.writeStartElement(kBoolTag);
            writeKey(w, e.key);
            w.writeCharacters(e.b ? QStringLiteral("true") : QStringLiteral("false"));
            w.writeEndElement();
            break;
        case Int:
            w.writeStartElement(kIntTag);
            writeKey(w, e.key);
            w.writeCharacters(QString::number(e.i));
            w.writeEndElement();
            break;
        case Float:
            w.writeStartElement(kFloatTag);
            writeKey(w, e.key);
            w.writeCharacters(floatToText(e.f));
            w.writeEndElement();
            break;
        case String:
            w.writeStartElement(kStringTag);
            writeKey(w, e.key);
            if (needsBase64(e.s)) {
                w.writeAttribute(kEncodingAttr, kBase64);
                w.writeCharacters(toBase64(e.s));
            } else {
                w.writeCharacters(e.s);
            }
            w.writeEndElement();
            break;
        case Settings:
            w.writeStartElement(kSettingsTag);
            writeKey(w, e.key);
            e.child->d->write(w);
            w.writeEndElement();
            break;
        case Invalid:
            break;
        }
    }
}

namespace {

// Reads the key of a value element; every other attribute must be one of extra.
bool readKey(const QXmlStreamReader& r, QString* key, const QString& extra = QString())
{
    bool haveKey = false;
    const QXmlStreamAttributes attrs = r.attributes();
    for (const QXmlStreamAttribute& a : attrs) {
        const QStringRef name = a.qualifiedName();
        if (haveKey && (name == kKeyAttr || name == kKeyBase64Attr))
            return false;
        if (name == kKeyAttr) {
            *key = a.value().toString();
            haveKey = true;
        } else if (name == kKeyBase64Attr) {
            if (!fromBase64(a.value().toString(), key))
                return false;
            haveKey = true;
        } else if (extra.isEmpty() || name != extra) {
            return false;
        }
    }
    return haveKey;
}

bool plainElement(const QXmlStreamReader& r)
{
    return r.namespaceUri().isEmpty() && r.namespaceDeclarations().isEmpty();
}

} // namespace

// Reads the values of one record up to its end tag; the start tag has been read.
bool KrSettings::Private::read(QXmlStreamReader& r, int depth)
{
    while (!r.atEnd()) {
        switch (r.readNext()) {
        case QXmlStreamReader::EndElement:
            return true;
        case QXmlStreamReader::Comment:
            continue;
        case QXmlStreamReader::Characters:
            if (!r.isWhitespace())
                return false;
            continue;
        case QXmlStreamReader::StartElement:
            break;
        default:
            return false;
        }
        if (!plainElement(r))
            return false;
        const QStringRef tag = r.qualifiedName();
        QString key;
        ValueType type = Invalid;
        bool base64 = false;
        if (tag == kStringTag) {
            if (!readKey(r, &key, kEncodingAttr))
                return false;
            if (r.attributes().hasAttribute(kEncodingAttr)) {
                if (r.attributes().value(kEncodingAttr) != kBase64)
                    return false;
                base64 = true;
            }
            type = String;
        } else {
            if (!readKey(r, &key))
                return false;
            if (tag == kBoolTag)
                type = Bool;
            else if (tag == kIntTag)
                type = Int;
            else if (tag == kFloatTag)
                type = Float;
            else if (tag == kSettingsTag)
                type = Settings;
            else
                return false;
        }
        if (index.contains(key))
            return false;

        Entry e;
        e.key = key;
        e.type = type;
        if (type == Settings) {
            if (depth >= kMaxDepth)
                return false;
            e.child.reset(new KrSettings);
            if (!e.child->d->read(r, depth + 1))
                return false;
        } else {
            const QString text = r.readElementText();
            if (r.hasError())
                return false;
            bool ok = false;
            switch (type) {
            case Bool:
                ok = text == QLatin1String("true") || text == QLatin1String("false");
                e.b = text == QLatin1String("true");
                break;
            case Int:
                ok = isPlainInt(text);
                if (ok)
                    e.i = text.toInt(&ok);
                break;
            case Float:
                ok = textToFloat(text, &e.f);
                break;
            case String:
                if (base64)
                    ok = fromBase64(text, &e.s);
                else {
                    e.s = text;
                    ok = true;
                }
                break;
            default:
                break;
            }
            if (!ok)
                return false;
        }
        index.insert(key, int(entries.size()));
        entries.push_back(std::move(e));
    }
    return false;
}

KrSettings::KrSettings() : d(new Private) {}

KrSettings::KrSettings(const KrSettings& other) : d(new Private)
{
    d->copyFrom(*other.d);
}

KrSettings& KrSettings::operator=(const KrSettings& other)
{
    if (this != &other) {
        // Copy first: other may live inside this record, or this inside other.
        KrSettings copy(other);
        std::swap(d, copy.d);
    }
    return *this;
}

KrSettings::~KrSettings() = default;

bool KrSettings::operator==(const KrSettings& other) const
{
    if (d->entries.size() != other.d->entries.size())
        return false;
    for (size_t n = 0; n < d->entries.size(); ++n) {
        const Private::Entry& a = d->entries[n];
        const Private::Entry& b = other.d->entries[n];
        if (a.type != b.type || a.key != b.key)
            return false;
        switch (a.type) {
        case Bool:
            if (a.b != b.b)
                return false;
            break;
        case Int:
            if (a.i != b.i)
                return false;
            break;
        case Float:
            // Bitwise, so a record always equals its copy (NaN) and -0 differs from 0.
            if (doubleBits(a.f) != doubleBits(b.f))
                return false;
            break;
        case String:
            if (a.s != b.s)
                return false;
            break;
        case Settings:
            if (*a.child != *b.child)
                return false;
            break;
        case Invalid:
            break;
        }
    }
    return true;
}

int KrSettings::getNumKeys() const
{
    return int(d->entries.size());
}

QString KrSettings::getKey(int i) const
{
    if (i < 0 || i >= int(d->entries.size()))
        return QString();
    return d->entries[size_t(i)].key;
}

QStringList KrSettings::getKeys() const
{
    QStringList keys;
    keys.reserve(int(d->entries.size()));
    for (const Private::Entry& e : d->entries)
        keys.append(e.key);
    return keys;
}

bool KrSettings::hasKey(const QString& key) const
{
    return d->find(key) >= 0;
}

KrSettings::ValueType KrSettings::getValueType(const QString& key) const
{
    const int at = d->find(key);
    return at < 0 ? Invalid : d->entries[size_t(at)].type;
}

void KrSettings::setBoolValue(const QString& key, bool value)
{
    Private::Entry& e = d->slot(key);
    Private::resetValue(e, Bool);
    e.b = value;
}

void KrSettings::setIntValue(const QString& key, int value)
{
    Private::Entry& e = d->slot(key);
    Private::resetValue(e, Int);
    e.i = value;
}

void KrSettings::setFloatValue(const QString& key, double value)
{
    Private::Entry& e = d->slot(key);
    Private::resetValue(e, Float);
    e.f = value;
}

void KrSettings::setStringValue(const QString& key, const QString& value)
{
    Private::Entry& e = d->slot(key);
    Private::resetValue(e, String);
    e.s = value;
}

bool KrSettings::getBoolValue(const QString& key, bool defaultValue) const
{
    const int at = d->find(key);
    if (at < 0 || d->entries[size_t(at)].type != Bool)
        return defaultValue;
    return d->entries[size_t(at)].b;
}

int KrSettings::getIntValue(const QString& key, int defaultValue) const
{
    const int at = d->find(key);
    if (at < 0 || d->entries[size_t(at)].type != Int)
        return defaultValue;
    return d->entries[size_t(at)].i;
}

double KrSettings::getFloatValue(const QString& key, double defaultValue) const
{
    const int at = d->find(key);
    if (at < 0 || d->entries[size_t(at)].type != Float)
        return defaultValue;
    return d->entries[size_t(at)].f;
}

QString KrSettings::getStringValue(const QString& key, const QString& defaultValue) const
{
    const int at = d->find(key);
    if (at < 0 || d->entries[size_t(at)].type != String)
        return defaultValue;
    return d->entries[size_t(at)].s;
}

KrSettings* KrSettings::setSettingsValue(const QString& key)
{
    Private::Entry& e = d->slot(key);
    // An existing nested record is emptied in place, so pointers to it stay valid.
    if (e.type == Settings) {
        e.child->clear();
        return e.child.get();
    }
    Private::resetValue(e, Settings);
    e.child.reset(new KrSettings);
    return e.child.get();
}

KrSettings* KrSettings::setSettingsValue(const QString& key, const KrSettings& value)
{
    // value may be this record or live inside it: copy before touching anything.
    KrSettings copy(value);
    Private::Entry& e = d->slot(key);
    if (e.type == Settings) {
        std::swap(e.child->d, copy.d);
        return e.child.get();
    }
    Private::resetValue(e, Settings);
    e.child.reset(new KrSettings);
    std::swap(e.child->d, copy.d);
    return e.child.get();
}

KrSettings* KrSettings::getSettingsValue(const QString& key)
{
    const int at = d->find(key);
    if (at < 0 || d->entries[size_t(at)].type != Settings)
        return nullptr;
    return d->entries[size_t(at)].child.get();
}

const KrSettings* KrSettings::getSettingsValue(const QString& key) const
{
    const int at = d->find(key);
    if (at < 0 || d->entries[size_t(at)].type != Settings)
        return nullptr;
    return d->entries[size_t(at)].child.get();
}

bool KrSettings::removeValue(const QString& key)
{
    const int at = d->find(key);
    if (at < 0)
        return false;
    d->index.remove(key);
    d->entries.erase(d->entries.begin() + at);
    for (size_t n = size_t(at); n < d->entries.size(); ++n)
        d->index[d->entries[n].key] = int(n);
    return true;
}

void KrSettings::clear()
{
    d->entries.clear();
    d->index.clear();
}

QString KrSettings::toString() const
{
    QString out;
    {
        QXmlStreamWriter w(&out);
        w.setAutoFormatting(true);
        w.setAutoFormattingIndent(1);
        w.writeStartElement(kSettingsTag);
        w.writeAttribute(kVersionAttr, QStringLiteral("1"));
        d->write(w);
        w.writeEndElement();
    }
    // Auto-formatting puts a line break before the root element and after it.
    return asciiOnly(out.trimmed());
}

bool KrSettings::fromString(const QString& text)
{
    if (text.isEmpty() || text.size() > kMaxTextLength)
        return false;
    QXmlStreamReader r(text);
    Private parsed;
    bool haveRoot = false;
    while (!r.atEnd()) {
        switch (r.readNext()) {
        case QXmlStreamReader::StartDocument:
        case QXmlStreamReader::EndDocument:
        case QXmlStreamReader::Comment:
            break;
        case QXmlStreamReader::Characters:
            if (!r.isWhitespace())
                return false;
            break;
        case QXmlStreamReader::StartElement: {
            if (haveRoot || !plainElement(r) || r.qualifiedName() != kSettingsTag)
                return false;
            const QXmlStreamAttributes attrs = r.attributes();
            if (attrs.size() != 1 || attrs.value(kVersionAttr) != QLatin1String("1"))
                return false;
            if (!parsed.read(r, 0))
                return false;
            haveRoot = true;
            break;
        }
        default:
            // A document type (and with it entity declarations), processing instructions and
            // anything else are not part of a settings text.
            return false;
        }
    }
    if (r.hasError() || !haveRoot)
        return false;
    std::swap(d->entries, parsed.entries);
    std::swap(d->index, parsed.index);
    return true;
}
