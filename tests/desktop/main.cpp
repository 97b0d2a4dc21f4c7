// SPDX-License-Identifier: MIT
// Runs the tests with Qt's platform "offscreen", which draws into memory.
#include <cstdlib>

#include <QApplication>
#include <gmock/gmock.h>

#include "support/HermeticEnvironment.hpp"
#include "support/TemporaryFolder.hpp"

int main(int count, char **arguments)
{
    testing::InitGoogleMock(&count, arguments);
    const vclink::test::TemporaryFolder folder;
    // Qt and its fonts have caches and settings too.
    const vclink::test::HermeticEnvironment environment(folder.path());
    ::setenv("QT_QPA_PLATFORM", "offscreen", 1);
    const QApplication application(count, arguments);
    QCoreApplication::setApplicationName(QStringLiteral("vclink-desktop"));
    return RUN_ALL_TESTS();
}
