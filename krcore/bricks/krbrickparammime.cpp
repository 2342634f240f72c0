#include "krbrickparammime.h"

#include "krbrickparam.h"
#include "krshaderbrick.h"

const QString KrBrickParamMime::s_mimeType = QStringLiteral("application/x-krbrickparam");

KrBrickParamMime::KrBrickParamMime(KrBrickParam* param) : m_param(param)
{
    // Readable text for other programs; the parameter itself travels as the pointer above.
    QByteArray text;
    if (param) {
        const KrShaderBrick* brick = param->getBrick();
        text = QStringLiteral("Brick_%1/%2")
                   .arg(brick ? brick->getBrickID() : 0)
                   .arg(param->getParamArg(0))
                   .toUtf8();
    }
    setData(s_mimeType, text);
}

KrBrickParamMime::~KrBrickParamMime() = default;

KrBrickParam* KrBrickParamMime::decode(const QMimeData* data)
{
    const auto* mime = qobject_cast<const KrBrickParamMime*>(data);
    return mime ? mime->getParam() : nullptr;
}
