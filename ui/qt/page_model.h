// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <QAbstractListModel>
#include <QString>
#include <vector>

#include "ui/list_page.h"
#include "ui/page_snapshot.h"
#include "ui/snapshot_difference.h"

namespace probeview::qt {

// One list page as the rows of a Qt list: the sections one after the other, each row knowing its section's number.
// It shows the page's last snapshot and follows a reload by the difference to it, so that a list view keeps its scroll
// position, its selection and a flick under way. A section without rows has one row that is not shown, because a list
// view draws a section's header only above a row. Main thread.
class PageModel final : public QAbstractListModel {
  Q_OBJECT
  Q_PROPERTY(QString title READ title CONSTANT FINAL)
  // While held, reloads wait; they are made up for by one when the hold ends.
  Q_PROPERTY(bool held READ held WRITE setHeld NOTIFY heldChanged FINAL)
  // Counts the changes of section titles, so that headers know when to ask again.
  Q_PROPERTY(int titleRevision READ titleRevision NOTIFY titlesChanged FINAL)

 public:
  enum Role { LabelRole = Qt::UserRole, ValueRole, HasValueRole, IsShownRole, DisclosureRole, SpokenRole, SectionRole };
  Q_ENUM(Role)

  // Takes the page's first snapshot and from then on follows its reloads, until detach() or until the model goes. The
  // page must live until then.
  explicit PageModel(ListPage& page, QObject* parent = nullptr);
  ~PageModel() override;

  // The page is about to die: what is shown stays, nothing follows any more.
  void detach();

  QString title() const { return title_; }
  bool held() const { return held_; }
  void setHeld(bool held);
  int titleRevision() const { return titleRevision_; }

  // Empty for a section without a title, and for one that is gone.
  Q_INVOKABLE QString sectionTitle(int section) const;
  // The next row that is shown, -1 if there is none. Rows count through all sections.
  Q_INVOKABLE int rowAfter(int row) const;
  Q_INVOKABLE int rowBefore(int row) const;

  // Null for a row that is not shown or does not exist.
  const ListCell* cell(int row) const;
  const PageSnapshot& shown() const { return shown_; }

  int rowCount(const QModelIndex& parent = {}) const override;
  QVariant data(const QModelIndex& index, int role) const override;
  QHash<int, QByteArray> roleNames() const override;

 signals:
  void heldChanged();
  void titlesChanged();
  void reloaded();

 private:
  struct Place {
    std::size_t section;
    std::size_t row;
  };

  void reload();
  void follow(const PageSnapshot& after);
  // Of the kinds that make rows or titles come and go.
  void apply(const SnapshotEdit& edit, const PageSnapshot& after);
  // How many rows of the Qt list a section takes; where a section's first one is.
  static int extent(const PageSnapshot::Section& section);
  int start(std::size_t section) const { return starts_[section]; }
  void countRows(std::size_t fromSection = 0);
  Place placeOf(int row) const;
  void announceChange(int first, int last);

  ListPage* page_;
  QString title_;
  PageSnapshot shown_;
  std::vector<int> starts_;  // of each section, and the end of the last one
  bool held_ = false;
  bool reloadDue_ = false;
  int titleRevision_ = 0;
};

}  // namespace probeview::qt
