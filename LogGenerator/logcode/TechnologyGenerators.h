#pragma once

// The generators of the three log-code technologies. Each fixes its display
// template and class index; the UTRAN one finds its template by searching the
// resources for a property list whose name contains "UTRAN".

#include <memory>

#include "LogGenerator/logcode/QNDLogGenerator2.h"

namespace corvane {

class QND_GSMLogGenerator final : public QNDLogGenerator2 {
 public:
  QND_GSMLogGenerator();
  ~QND_GSMLogGenerator() override;
  static std::unique_ptr<LogGenerator> generator();

 private:
  static Configuration configuration();
};

class LTELogGenerator final : public QNDLogGenerator2 {
 public:
  LTELogGenerator();
  ~LTELogGenerator() override;
  static std::unique_ptr<LogGenerator> generator();

 private:
  static Configuration configuration();
};

class UTRANLogGenerator final : public QNDLogGenerator2 {
 public:
  static std::unique_ptr<LogGenerator> generator();

  // The template name: the first "plist" resource, in listing order, whose
  // path contains "UTRAN" in any letter case; nothing when there is none.
  static std::optional<std::string> findTemplateName();

 private:
  using QNDLogGenerator2::QNDLogGenerator2;
};

}  // namespace corvane
