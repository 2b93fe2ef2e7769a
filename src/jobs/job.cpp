// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/job.h"

#include "jobs/job_p.h"

#include <QEventLoop>
#include <QPointer>
#include <QTimer>

namespace VeyFM {

JobPrivate::~JobPrivate() = default;

Job::Job(QObject* parent)
    : Job(*new JobPrivate, parent)
{
}

Job::Job(JobPrivate& dd, QObject* parent)
    : QObject(parent)
    , d_ptr(&dd)
{
    d_ptr->q_ptr = this;
}

Job::~Job() = default;

void Job::exec()
{
    Q_D(Job);
    const QPointer<Job> alive(this);
    start();
    if (!alive || d->finished) {
        return;
    }
    // The job has to outlive the loop.
    const bool deleteOnFinish = d->deleteOnFinish;
    d->deleteOnFinish = false;
    QEventLoop loop;
    d->eventLoop = &loop;
    connect(this, &QObject::destroyed, &loop, &QEventLoop::quit); // By its parent, for example.
    loop.exec(QEventLoop::ExcludeUserInputEvents);
    if (!alive) {
        return;
    }
    d->eventLoop = nullptr;
    d->deleteOnFinish = deleteOnFinish;
    if (deleteOnFinish) {
        deleteLater();
    }
}

bool Job::isDeleteOnFinish() const
{
    return d_func()->deleteOnFinish;
}

void Job::setDeleteOnFinish(bool deleteOnFinish)
{
    d_func()->deleteOnFinish = deleteOnFinish;
}

QVariant Job::data() const
{
    return d_func()->data;
}

void Job::setData(const QVariant& data)
{
    d_func()->data = data;
}

int Job::error() const
{
    return d_func()->error;
}

QString Job::errorString() const
{
    return d_func()->errorString;
}

void Job::setError(int errorCode, const QString& errorString)
{
    Q_D(Job);
    d->error = errorCode;
    d->errorString = errorString;
}

void Job::finishedOkLater()
{
    QTimer::singleShot(0, this, &Job::finishedOk);
}

void Job::finishedOk()
{
    setError(0, QString());
    finish();
}

void Job::finishedWithError(int errorCode, QString errorString)
{
    setError(errorCode, errorString);
    finish();
}

void Job::finish()
{
    Q_D(Job);
    d->finished = true;
    if (d->eventLoop) {
        d->eventLoop->quit();
    }
    // Asked for before the signal: the deletion is deferred, so the slots still see a live job.
    if (d->deleteOnFinish) {
        deleteLater();
    }
    Q_EMIT finished(this);
}

} // namespace VeyFM
