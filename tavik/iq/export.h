// The tuning library is built with hidden visibility: only what is marked TAVIK_EXPORT is part of
// the shared library's interface. The static archive keeps every symbol, for offline tools and
// white-box tests.
#ifndef TAVIK_IQ_EXPORT_H_
#define TAVIK_IQ_EXPORT_H_

#define TAVIK_EXPORT __attribute__((visibility("default")))

#endif  // TAVIK_IQ_EXPORT_H_
