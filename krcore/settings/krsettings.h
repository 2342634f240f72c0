#pragma once

#include "krcore_global.h"

#include <QString>
#include <QStringList>
#include <memory>

// A record of keyed values in insertion order: bool, int, float (double), string and nested
// records. It is what bricks, brick users, files and the clipboard store themselves in.
// Setting an existing key replaces its value in place (the key keeps its position).
class KRCORE_EXPORT KrSettings
{
public:
    enum ValueType { Invalid = 0, Bool, Int, Float, String, Settings };

    KrSettings();
    KrSettings(const KrSettings& other);
    KrSettings& operator=(const KrSettings& other);
    ~KrSettings();

    // Same keys in the same order, same values; floats compare bit for bit (NaN equals
    // itself, -0 differs from 0).
    bool operator==(const KrSettings& other) const;
    bool operator!=(const KrSettings& other) const { return !(*this == other); }

    int getNumKeys() const;
    QString getKey(int i) const; // empty when out of range
    QStringList getKeys() const;
    bool hasKey(const QString& key) const;
    ValueType getValueType(const QString& key) const;
    bool isEmpty() const { return getNumKeys() == 0; }

    void setBoolValue(const QString& key, bool value);
    void setIntValue(const QString& key, int value);
    void setFloatValue(const QString& key, double value);
    void setStringValue(const QString& key, const QString& value);

    // Typed getters answer the default when the key is missing or holds another type.
    bool getBoolValue(const QString& key, bool defaultValue = false) const;
    int getIntValue(const QString& key, int defaultValue = 0) const;
    double getFloatValue(const QString& key, double defaultValue = 0.0) const;
    QString getStringValue(const QString& key, const QString& defaultValue = QString()) const;

    // Makes a new, empty nested record under key (replacing any value there) and returns it.
    // The record is owned by this one. A nested record already there is emptied in place, so
    // pointers to it stay valid.
    KrSettings* setSettingsValue(const QString& key);
    // Stores a copy of value under key and returns the stored copy.
    KrSettings* setSettingsValue(const QString& key, const KrSettings& value);
    // The nested record under key, or null when there is none (or the key holds another type).
    KrSettings* getSettingsValue(const QString& key);
    const KrSettings* getSettingsValue(const QString& key) const;

    bool removeValue(const QString& key); // false when there was no such key
    void clear();

    // Readable XML text that keeps key order and types and round-trips every value exactly.
    QString toString() const;
    // Replaces this record with the one in text. Answers false, leaving the record as it was,
    // when text is not such a record: malformed or truncated XML, unknown elements or
    // attributes, values that do not fit their type, a key twice in one record, nesting deeper
    // than 256 records or more than 64 Mi characters.
    bool fromString(const QString& text);

private:
    struct Private;
    std::unique_ptr<Private> d;
};
