#pragma once

// The app layer has members named "signals" (the run's shared flags), which Qt's keyword
// macros would rewrite. Every file of this front end includes this header before any Qt
// header and writes Q_SIGNALS / Q_EMIT instead.

#ifndef QT_NO_KEYWORDS
#define QT_NO_KEYWORDS
#endif
#undef signals
#undef slots
#undef emit
