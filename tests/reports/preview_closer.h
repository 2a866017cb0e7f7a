#pragma once

#include <QList>
#include <QObject>
#include <QStringList>
#include <QTimer>

namespace quotas::test {

// Closes every modal print preview as soon as it is on screen, with the
// Escape key as a user would, after noting its title and page count.
class PreviewCloser : public QObject {
    Q_OBJECT
public:
    PreviewCloser();

    QStringList titles;
    QList<int> pageCounts;

private:
    void poll();
    QTimer m_timer;
};

}  // namespace quotas::test
