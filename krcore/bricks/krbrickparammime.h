#pragma once

#include "krcore_global.h"

#include <QMimeData>
#include <QPointer>

class KrBrickParam;

// Drag data of one brick parameter. Only the process that made it can read it back, and only
// while the parameter exists.
class KRCORE_EXPORT KrBrickParamMime : public QMimeData
{
    Q_OBJECT
public:
    static const QString s_mimeType; // "application/x-krbrickparam"

    explicit KrBrickParamMime(KrBrickParam* param);
    ~KrBrickParamMime() override;

    KrBrickParam* getParam() const { return m_param.data(); }
    // The parameter carried by data, or null when data is not ours or the parameter is gone.
    static KrBrickParam* decode(const QMimeData* data);

private:
    QPointer<KrBrickParam> m_param;
};
