#include "Stats.h"

namespace ravel_dump {

namespace {
const std::size_t kProblemLines = 20;
}

const char* PidRoleName(PidRole role) {
  switch (role) {
    case PidRole::kNone: return "";
    case PidRole::kPat: return "PAT";
    case PidRole::kPmt: return "PMT";
    case PidRole::kNit: return "NIT";
    case PidRole::kSdt: return "SDT/BAT";
    case PidRole::kEit: return "EIT";
    case PidRole::kTime: return "TDT/TOT";
    case PidRole::kBit: return "BIT";
    case PidRole::kAit: return "AIT";
    case PidRole::kCarousel: return "data carousel";
    case PidRole::kStreamEvents: return "stream events";
    case PidRole::kRequested: return "requested";
  }
  return "";
}

void Stats::Problem(const std::string& line) {
  if (onProblem) onProblem(line);
  if (problems.size() < kProblemLines) problems.push_back(line);
}

}  // namespace ravel_dump
