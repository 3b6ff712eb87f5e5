// The transport tests need a QCoreApplication for the Qt run loop; everything
// else runs on real sockets in a per-test runtime directory.

#include <QCoreApplication>
#include <gtest/gtest.h>

#include "platform/Log.h"

int main(int argc, char** argv) {
  QCoreApplication application(argc, argv);
  ::testing::InitGoogleTest(&argc, argv);
  // Keep the machine's syslog clean of test noise.
  corvane::log::setSink(std::make_shared<corvane::log::CapturingSink>());
  return RUN_ALL_TESTS();
}
