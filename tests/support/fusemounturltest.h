// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_FUSEMOUNTURLTEST_H
#define VEYFM_TESTS_FUSEMOUNTURLTEST_H

#include "support/fusemountjobtest.h"

/// FTP and SFTP mounts that need no question: what is the same for both. A subclass brings the
/// protocol, and tests of what is that one's own.
class FuseMountUrlTest : public FuseMountJobTest
{
    Q_OBJECT

protected:
    using FuseMountJobTest::FuseMountJobTest;

    /// Adds rows that the other protocol has not, or differently. @{
    virtual void addMountedUrls() {}
    virtual void addUnsafeUrls() {}
    /// @}

private Q_SLOTS:
    void otherScheme_data();
    void otherScheme();
    void alreadyMounted_data();
    void alreadyMounted();
    void registeredWithoutAPath();
    void twoPathsShareAMount();
    void addresses_data();
    void addresses();
    void unsafeUrls_data();
    void unsafeUrls();
    void directoriesAreForTheUserAlone();
    void linkInPlaceOfTheDirectory();
    void directoryOfAnotherUser();
};

#endif
