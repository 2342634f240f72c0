#include "settings_random.h"

#include "krsettings.h"

#include <cstring>
#include <limits>

namespace KrSettingsRandom {

namespace {

// Code units picked on purpose: markup characters, whitespace XML normalises, characters XML
// cannot carry at all, and both halves of surrogate pairs.
const ushort kTricky[] = {'<',    '>',    '&',    '"',    '\'',   ' ',    '\t',   '\n',
                          '\r',   0x0000, 0x0001, 0x001F, 0x007F, 0x0085, 0x00A0, 0x00E9,
                          0x2028, 0xD800, 0xDBFF, 0xDC00, 0xDFFF, 0xFFFD, 0xFFFE, 0xFFFF,
                          0xFEFF, ']',    '/',    '=',    ';',    '#',    'x',    '@'};

} // namespace

QString randomText(QRandomGenerator& rng, int maxLength)
{
    const int length = rng.bounded(maxLength + 1);
    QString text;
    text.reserve(length * 2);
    for (int i = 0; i < length; ++i) {
        switch (rng.bounded(6)) {
        case 0:
        case 1:
            text.append(QChar(ushort('a' + rng.bounded(26))));
            break;
        case 2:
            text.append(QChar(kTricky[rng.bounded(int(sizeof kTricky / sizeof kTricky[0]))]));
            break;
        case 3: // any BMP code unit, lone surrogates included
            text.append(QChar(ushort(rng.bounded(0x10000))));
            break;
        case 4: { // a proper astral character
            const uint code = 0x10000 + rng.bounded(0x100000);
            text.append(QChar(QChar::highSurrogate(code)));
            text.append(QChar(QChar::lowSurrogate(code)));
            break;
        }
        default:
            text.append(QChar(ushort(0x20 + rng.bounded(0x60))));
            break;
        }
    }
    return text;
}

double randomDouble(QRandomGenerator& rng)
{
    static const double specials[] = {0.0,
                                      -0.0,
                                      std::numeric_limits<double>::infinity(),
                                      -std::numeric_limits<double>::infinity(),
                                      std::numeric_limits<double>::quiet_NaN(),
                                      -std::numeric_limits<double>::quiet_NaN(),
                                      std::numeric_limits<double>::signaling_NaN(),
                                      std::numeric_limits<double>::denorm_min(),
                                      -std::numeric_limits<double>::denorm_min(),
                                      std::numeric_limits<double>::min(),
                                      std::numeric_limits<double>::max(),
                                      std::numeric_limits<double>::lowest(),
                                      std::numeric_limits<double>::epsilon(),
                                      0.1,
                                      1.0 / 3.0,
                                      1e23};
    switch (rng.bounded(4)) {
    case 0:
        return specials[rng.bounded(int(sizeof specials / sizeof specials[0]))];
    case 1: // any bit pattern: NaN payloads, denormals, everything
    {
        const quint64 bits = rng.generate64();
        double v;
        std::memcpy(&v, &bits, sizeof v);
        return v;
    }
    case 2:
        return double(rng.bounded(2000)) / 8.0 - 100.0;
    default:
        return (rng.generateDouble() - 0.5) * 1e6;
    }
}

void fillRecord(QRandomGenerator& rng, KrSettings& record, int maxKeys, int maxDepth)
{
    const int keys = rng.bounded(maxKeys + 1);
    for (int k = 0; k < keys; ++k) {
        QString key;
        switch (rng.bounded(4)) {
        case 0:
            key = QStringLiteral("Key%1").arg(k);
            break;
        case 1:
            key = rng.bounded(4) == 0 ? QString() : randomText(rng, 3);
            break;
        default:
            key = randomText(rng, 12);
            break;
        }
        switch (rng.bounded(maxDepth > 0 ? 6 : 5)) {
        case 0:
            record.setBoolValue(key, rng.bounded(2) == 1);
            break;
        case 1: {
            int v;
            const quint32 raw = rng.generate();
            std::memcpy(&v, &raw, sizeof v);
            record.setIntValue(key, rng.bounded(3) == 0 ? v : rng.bounded(-1000, 1000));
            break;
        }
        case 2:
            record.setFloatValue(key, randomDouble(rng));
            break;
        case 3:
        case 4:
            record.setStringValue(key, randomText(rng, rng.bounded(8) == 0 ? 200 : 20));
            break;
        default:
            fillRecord(rng, *record.setSettingsValue(key), maxKeys / 2 + 1, maxDepth - 1);
            break;
        }
    }
}

} // namespace KrSettingsRandom
