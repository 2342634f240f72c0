#pragma once

#include <QRandomGenerator>
#include <QString>

class KrSettings;

// Seeded random settings records for round-trip tests and fuzz seeds: every value type, keys
// that are empty, non-ASCII, astral, or hold characters XML cannot carry, and nesting.
namespace KrSettingsRandom {

QString randomText(QRandomGenerator& rng, int maxLength);
double randomDouble(QRandomGenerator& rng);
// Fills record with up to maxKeys values; nested records go at most maxDepth levels down.
void fillRecord(QRandomGenerator& rng, KrSettings& record, int maxKeys, int maxDepth);

} // namespace KrSettingsRandom
