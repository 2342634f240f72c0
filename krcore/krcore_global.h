#pragma once

#include <QtGlobal>

#if defined(KRCORE_LIBRARY)
#define KRCORE_EXPORT Q_DECL_EXPORT
#else
#define KRCORE_EXPORT Q_DECL_IMPORT
#endif
