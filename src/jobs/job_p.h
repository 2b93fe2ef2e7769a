// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_JOB_P_H
#define VEYFM_JOB_P_H

#include "jobs/job.h"

class QEventLoop;

namespace VeyFM {

class VEYFMVFS_EXPORT JobPrivate
{
public:
    virtual ~JobPrivate();

    Job* q_ptr = nullptr;
    int error = 0;
    QString errorString;
    bool deleteOnFinish = true;
    QEventLoop* eventLoop = nullptr;
    bool finished = false;
    QVariant data;
};

} // namespace VeyFM

#endif
