// Which broadcast standard a capture follows, Brazilian (ABNT NBR 15603, the
// library's default) or Japanese (ARIB), told by what its tables say: country
// and language codes, network ids and the coding of its texts.
#ifndef RAVEL_DUMP_STANDARDDETECTION_H
#define RAVEL_DUMP_STANDARDDETECTION_H

#include <string>

#include "Summary.h"

namespace ravel_dump {

struct StandardChoice {
  int standard = 0;    // RAVEL_STANDARD_BRAZIL or RAVEL_STANDARD_JAPAN
  std::string reason;  // the signs that chose it, for a person
};

// The standard with more signs in `summary`; Brazil, the library's default,
// when neither has more.
StandardChoice DetectStandard(const Summary& summary);

// The standard named on the command line.
StandardChoice GivenStandard(int standard);

const char* StandardName(int standard);

}  // namespace ravel_dump

#endif
