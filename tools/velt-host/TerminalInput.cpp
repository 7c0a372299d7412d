// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#include "velt-host/TerminalInput.h"

#include <histedit.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <utility>

#include "velt-host/KeyWatchEnd.h"
#include "velt-host/SingleKeys.h"

namespace velthost {

void TerminalInput::EditorCloser::operator()(editline* editor) const { el_end(editor); }

void TerminalInput::HistoryCloser::operator()(struct history* lines) const { history_end(lines); }

TerminalInput::TerminalInput(StopSignals& signals, std::function<std::string()> prompt)
    : signals_(signals), prompt_(std::move(prompt)) {}

// The editor goes before the history it refers to.
TerminalInput::~TerminalInput() { editor_.reset(); }

TerminalInput* TerminalInput::Owner(editline* editor) {
  void* owner = nullptr;
  el_get(editor, EL_CLIENTDATA, &owner);
  return static_cast<TerminalInput*>(owner);
}

char* TerminalInput::Prompt(editline* editor) {
  TerminalInput* const self = Owner(editor);
  self->promptText_ = self->prompt_();
  return self->promptText_.data();
}

// Reads one character for the editor, decoding the terminal's multi-byte
// text. A stop signal counts as the end of input, so the editor gives up
// the line, restores the terminal and returns.
int TerminalInput::ReadCharacter(editline* editor, wchar_t* character) {
  TerminalInput* const self = Owner(editor);
  for (;;) {
    if (self->signals_.Wait(STDIN_FILENO, std::chrono::milliseconds(-1)) ==
        StopSignals::Event::kSignal) {
      return 0;
    }
    char byte = 0;
    const ssize_t received = ::read(STDIN_FILENO, &byte, 1);
    if (received == 0) {
      return 0;
    }
    if (received < 0) {
      if (errno == EINTR || errno == EAGAIN) {
        continue;
      }
      return -1;
    }
    if (self->TooLong(byte)) {
      continue;
    }
    // A false positive: mbrtowc shares hidden state between threads only
    // when it is given none of its own; each editor passes its own decoder_.
    // NOLINTNEXTLINE(concurrency-mt-unsafe)
    const std::size_t decoded = std::mbrtowc(character, &byte, 1, &self->decoder_);
    if (decoded == static_cast<std::size_t>(-2)) {
      continue;
    }
    if (decoded == static_cast<std::size_t>(-1)) {
      // Not text in the terminal's encoding: the byte stands for itself.
      self->decoder_ = std::mbstate_t{};
      *character = static_cast<wchar_t>(static_cast<unsigned char>(byte));
    }
    return 1;
  }
}

// Counts the bytes of the line being typed. Past kLongestLine they are
// dropped up to the end of the line, which then reaches the editor so that
// it gives the line up; Next refuses it.
bool TerminalInput::TooLong(char& byte) {
  const bool end = byte == '\n' || byte == '\r';
  if (dropping_) {
    byte = '\n';
    return !end;
  }
  if (!end && ++lineBytes_ > kLongestLine) {
    dropping_ = true;
    return true;
  }
  return false;
}

bool TerminalInput::OpenEditor() {
  history_.reset(history_init());
  if (history_ == nullptr) {
    return false;
  }
  HistEvent event{};
  history(history_.get(), &event, H_SETSIZE, kHistoryLines);
  history(history_.get(), &event, H_SETUNIQUE, 1);
  editor_.reset(el_init("velt-host", stdin, stdout, stderr));
  if (editor_ == nullptr) {
    return false;
  }
  el_set(editor_.get(), EL_CLIENTDATA, this);
  el_set(editor_.get(), EL_EDITOR, "emacs");
  el_set(editor_.get(), EL_PROMPT, &TerminalInput::Prompt);
  el_set(editor_.get(), EL_HIST, history, history_.get());
  el_set(editor_.get(), EL_GETCFN, &TerminalInput::ReadCharacter);
  return true;
}

LineInput::Read TerminalInput::Next(std::string& line) {
  if (signals_.Raised()) {
    return Read::kEnded;
  }
  if (editor_ == nullptr && !OpenEditor()) {
    return Read::kEnded;
  }
  lineBytes_ = 0;
  dropping_ = false;
  int count = 0;
  const char* text = nullptr;
  {
    // The editor switches the terminal to single keys only once the prompt
    // is out; a key typed in between would meet the line discipline instead
    // (Ctrl-D would be lost). Switching before the prompt closes that gap.
    const SingleKeys keys(STDIN_FILENO);
    text = el_gets(editor_.get(), &count);
  }
  if (text == nullptr || count <= 0 || signals_.Raised()) {
    // The shell's prompt starts on a line of its own after the console's; a
    // terminal that no longer takes output has no one left to tell.
    (void)std::fputs("\n", stdout);
    (void)std::fflush(stdout);
    return Read::kEnded;
  }
  if (dropping_) {
    return Read::kTooLong;
  }
  line.assign(text, static_cast<std::size_t>(count));
  if (!line.empty() && line.back() == '\n') {
    line.pop_back();
  }
  if (line.find_first_not_of(" \t") != std::string::npos) {
    HistEvent event{};
    history(history_.get(), &event, H_ENTER, line.c_str());
  }
  return Read::kLine;
}

std::unique_ptr<WatchEnd> TerminalInput::BeginWatch() {
  return std::make_unique<KeyWatchEnd>(STDIN_FILENO, signals_);
}

}  // namespace velthost
