// SPDX-License-Identifier: Apache-2.0
// Copyright 2026 The Velt Conduit Authors

#pragma once

#include <cwchar>
#include <functional>
#include <memory>
#include <string>

#include "velt-host/LineInput.h"
#include "velt-host/StopSignals.h"

struct editline;
struct history;

namespace velthost {

// Command lines typed on a terminal, with libedit's line editing (emacs
// keys) and an in-memory history recalled with the arrow keys. The prompt
// is asked for before each line. The line editor is made on the first
// line, so an object used only to watch for keys never touches the
// terminal's line settings. A stop signal ends the current line at once.
// Characters are decoded in the program's LC_CTYPE locale, which the
// program sets from the environment before any thread starts.
class TerminalInput final : public LineInput {
 public:
  // Lines kept in the history.
  static constexpr int kHistoryLines = 1000;

  TerminalInput(StopSignals& signals, std::function<std::string()> prompt);
  TerminalInput(const TerminalInput&) = delete;
  TerminalInput& operator=(const TerminalInput&) = delete;
  TerminalInput(TerminalInput&&) = delete;
  TerminalInput& operator=(TerminalInput&&) = delete;
  ~TerminalInput() override;

  Read Next(std::string& line) override;
  std::unique_ptr<WatchEnd> BeginWatch() override;
  bool KeyEndsWatch() const override { return true; }

 private:
  struct EditorCloser {
    void operator()(editline* editor) const;
  };
  struct HistoryCloser {
    void operator()(history* lines) const;
  };

  bool OpenEditor();
  static char* Prompt(editline* editor);
  static int ReadCharacter(editline* editor, wchar_t* character);
  static TerminalInput* Owner(editline* editor);
  bool TooLong(char& byte);

  StopSignals& signals_;
  std::function<std::string()> prompt_;
  std::string promptText_;
  std::mbstate_t decoder_{};
  // Bytes typed on the current line, and whether it is being dropped.
  std::size_t lineBytes_ = 0;
  bool dropping_ = false;
  std::unique_ptr<history, HistoryCloser> history_;
  std::unique_ptr<editline, EditorCloser> editor_;
};

}  // namespace velthost
