#include "TraceOutput.h"

#include "ByteText.h"
#include "Ravel_PGL.h"
#include "Stats.h"

namespace ravel_dump {

TraceOutput::TraceOutput(unsigned int levels, Stats& stats) : levels_(levels), stats_(stats), showOut_(nullptr), showEndedLine_(true), quiet_(false) {
  RavelPGL_SetTraceHook(&TraceOutput::OnTrace, this);
  RavelPGL_SetPanicHook(&TraceOutput::OnPanic, this);
}

TraceOutput::~TraceOutput() {
  RavelPGL_SetTraceHook(nullptr, nullptr);
  RavelPGL_SetPanicHook(nullptr, nullptr);
}

TraceOutput::ShowScope::ShowScope(TraceOutput& trace, std::FILE* out) : trace_(trace), previous_(trace.showOut_) {
  trace_.showOut_ = out;
}

TraceOutput::ShowScope::~ShowScope() { trace_.showOut_ = previous_; }

TraceOutput::QuietScope::QuietScope(TraceOutput& trace) : trace_(trace), previous_(trace.quiet_) {
  trace_.quiet_ = true;
}

TraceOutput::QuietScope::~QuietScope() { trace_.quiet_ = previous_; }

TraceOutput::SkipRecordScope::SkipRecordScope(TraceOutput& trace, std::vector<SkippedDescriptor>& skipped)
    : trace_(trace), previous_(trace.skipped_) {
  trace_.skipped_ = &skipped;
}

TraceOutput::SkipRecordScope::~SkipRecordScope() { trace_.skipped_ = previous_; }

void TraceOutput::OnTrace(unsigned int mask, const char* file, int line, const char* text, void* context) {
  TraceOutput* self = static_cast<TraceOutput*>(context);
  if (self->showOut_ != nullptr && (mask & kTraceLevels) == kTraceLevelDump) {
    std::string line = DecodeTextInTraceLine(text != nullptr ? text : "", self->textCoding_);
    std::string escaped = EscapeTraceText(line.c_str());
    if (!escaped.empty()) {
      std::fputs(escaped.c_str(), self->showOut_);
      self->showEndedLine_ = escaped.back() == '\n';
    }
    return;
  }
  SkippedDescriptor skipped;
  if (self->skipped_ != nullptr && ReadSkippedDescriptorTrace(text, skipped)) self->skipped_->push_back(skipped);
  if (!self->quiet_ && (mask & self->levels_ & kTraceLevels) != 0) {
    // One trace per line here, whether or not the text ends its line itself.
    std::string escaped = EscapeTraceText(text);
    if (escaped.empty() || escaped.back() != '\n') escaped += '\n';
    std::fprintf(stderr, "[0x%08x %s:%d] %s", mask, file != nullptr ? file : "?", line, escaped.c_str());
  }
}

void TraceOutput::OnPanic(const char* file, int line, void* context) {
  TraceOutput* self = static_cast<TraceOutput*>(context);
  ++self->stats_.panics;
  self->stats_.Problem(std::string("library panic at ") + (file != nullptr ? file : "?") + ":" +
                       std::to_string(line));
}

}  // namespace ravel_dump
