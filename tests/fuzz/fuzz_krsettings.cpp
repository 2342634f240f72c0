// libFuzzer target for KrSettings::fromString (not built by CMake). From the source root:
//   clang++ -g -O1 -fsanitize=fuzzer,address,undefined -fPIC -std=c++17 -DKRCORE_LIBRARY \
//     -Ikrcore -Ikrcore/settings -Itests/support $(pkg-config --cflags Qt5Core) \
//     tests/fuzz/fuzz_krsettings.cpp krcore/settings/krsettings.cpp \
//     tests/support/settings_random.cpp $(pkg-config --libs Qt5Core) -o fuzz_krsettings
//   mkdir -p corpus && ./fuzz_krsettings -seed_corpus_only=1 corpus   # writes seeds, exits
//   ./fuzz_krsettings -max_len=4096 -rss_limit_mb=2048 -dict=tests/fuzz/krsettings.dict corpus
// Every accepted text must round-trip; every refused one must leave the record untouched.
#include "krsettings.h"
#include "settings_random.h"

#include <QDir>
#include <QFile>

#include <cstdlib>
#include <cstring>

namespace {

KrSettings baseline()
{
    KrSettings s;
    s.setIntValue("Width", 3);
    s.setSettingsValue("Nested")->setStringValue("Title", "x");
    return s;
}

void writeSeeds(const char* folder)
{
    for (quint32 seed = 1; seed <= 64; ++seed) {
        QRandomGenerator rng(seed);
        KrSettings s;
        KrSettingsRandom::fillRecord(rng, s, 6, 2);
        QFile file(
            QDir(QString::fromLocal8Bit(folder)).filePath(QStringLiteral("seed%1").arg(seed)));
        if (file.open(QIODevice::WriteOnly))
            file.write(s.toString().toUtf8());
    }
}

} // namespace

extern "C" int LLVMFuzzerInitialize(int* argc, char*** argv)
{
    bool seedOnly = false;
    const char* folder = nullptr;
    for (int i = 1; i < *argc; ++i) {
        if (std::strcmp((*argv)[i], "-seed_corpus_only=1") == 0)
            seedOnly = true;
        else if ((*argv)[i][0] != '-')
            folder = (*argv)[i];
    }
    if (seedOnly) {
        if (folder)
            writeSeeds(folder);
        std::exit(0);
    }
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    static const KrSettings initial = baseline();
    const QString text = QString::fromUtf8(reinterpret_cast<const char*>(data), int(size));
    KrSettings s = initial;
    if (!s.fromString(text)) {
        if (s != initial)
            std::abort();
        return 0;
    }
    const QString written = s.toString();
    KrSettings again;
    if (!again.fromString(written) || again != s || again.toString() != written)
        std::abort();
    return 0;
}
