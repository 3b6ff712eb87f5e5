#pragma once

// What the screens ask of the application object: whether saving is offered,
// and to open and close the save screen.

namespace corvane {

class ScreenHost {
 public:
  virtual bool allowSaveButton() const = 0;
  virtual void showSaveView() = 0;
  virtual void closeSaveView() = 0;

 protected:
  ~ScreenHost() = default;
};

}  // namespace corvane
