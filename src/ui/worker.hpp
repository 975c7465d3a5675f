// Runs a piece of work on a worker thread and hands its result back to a window on the
// window's own thread, once the work has finished.
#pragma once

#include <QFutureWatcher>
#include <QThreadPool>
#include <QtConcurrent/QtConcurrentRun>
#include <type_traits>

#include "ui/config.hpp"

namespace tarn::ui {

// A pool of its own: a job, a test and a split may all run at once on two cores.
inline QThreadPool& workerPool() {
    static QThreadPool* pool = [] {
        auto* p = new QThreadPool;
        p->setMaxThreadCount(kWorkerThreads);
        return p;
    }();
    return *pool;
}

template <typename Work, typename Done>
void runOnWorker(QObject* context, Work work, Done done) {
    using Result = std::invoke_result_t<Work>;
    auto* watcher = new QFutureWatcher<Result>(context);
    QObject::connect(watcher, &QFutureWatcherBase::finished, context,
                     [watcher, done = std::move(done)]() mutable {
                         watcher->deleteLater();
                         done(watcher->result());
                     });
    watcher->setFuture(QtConcurrent::run(&workerPool(), std::move(work)));
}

}  // namespace tarn::ui
