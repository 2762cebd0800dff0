#include "TraceRecorder.h"

#include "Ravel_PGL.h"

TraceRecorder* TraceRecorder::current_ = nullptr;

TraceRecorder::TraceRecorder() : panics_(0), previous_(current_) {
  current_ = this;
  RavelPGL_SetTraceHook(&TraceRecorder::OnTrace, this);
  RavelPGL_SetPanicHook(&TraceRecorder::OnPanic, this);
}

TraceRecorder::~TraceRecorder() {
  current_ = previous_;
  RavelPGL_SetTraceHook(previous_ ? &TraceRecorder::OnTrace : 0, previous_);
  RavelPGL_SetPanicHook(previous_ ? &TraceRecorder::OnPanic : 0, previous_);
}

TraceLines TraceRecorder::Lines() const {
  TraceLines lines;
  for (const TraceRecord& record : records_) lines.push_back(std::make_pair(record.mask, record.text));
  return lines;
}

std::vector<std::string> TraceRecorder::TextsAt(unsigned int mask) const {
  std::vector<std::string> texts;
  for (const TraceRecord& record : records_) {
    if (record.mask == mask) texts.push_back(record.text);
  }
  return texts;
}

std::string TraceRecorder::Joined() const {
  std::string all;
  for (const TraceRecord& record : records_) all += record.text;
  return all;
}

void TraceRecorder::Clear() {
  records_.clear();
  panics_ = 0;
  panicFile_.clear();
}

void TraceRecorder::OnTrace(unsigned int mask, const char* file, int line, const char* text, void* context) {
  TraceRecord record = {mask, file ? file : "", line, text ? text : ""};
  static_cast<TraceRecorder*>(context)->records_.push_back(record);
}

void TraceRecorder::OnPanic(const char* file, int, void* context) {
  TraceRecorder* self = static_cast<TraceRecorder*>(context);
  ++self->panics_;
  self->panicFile_ = file ? file : "";
}
