#pragma once

#include <gtkmm/box.h>
#include <gtkmm/label.h>
#include <gtkmm/listbox.h>
#include <gtkmm/listboxrow.h>

#include <map>
#include <optional>
#include <set>
#include <string>

#include "host/window/PageContext.h"

namespace nimbo {

/// Lines by their numbers.
using LinesByNumber = std::map<std::uint64_t, TransitLineRef>;

/// One incident in full: what its publisher says, when, what it affects.
class IncidentCard final : public Gtk::ListBoxRow {
 public:
  /// `periods` are the incident's, one at least, each with the same texts. `line` is the line on whose page it stands,
  /// which is not named again.
  IncidentCard(const PageContext& context, const TransitIncidents& periods, std::optional<std::uint64_t> line);

  /// Names the lines that it affects, but for the one that is known. Until it is told their names it counts them.
  void showAffectedLines(const LinesByNumber& lines);
  /// Says when the publisher of its lines made his alerts, where he does.
  void showAsOf(const LinesByNumber& lines);

  /// The incident's number in decimal.
  std::string id() const { return std::to_string(_incident->muid()); }

 private:
  static Gtk::Label* addText(Gtk::Box& box, const std::string& text, const char* style);
  /// Adds a text of the incident, which is also said to a screen reader.
  Gtk::Label* addSaid(const std::string& text, const char* style);
  /// Says how grave it is, its effect and its cause, where the widget told that.
  void addMarks();
  void addTexts(const TransitIncident& incident);
  /// Shows the text of the image until the image itself has come, and where none comes.
  void addImage();
  void addDates(const TransitIncidents& periods);
  void addLink(const std::string& url);

  const PageContext& _context;
  TransitIncidentRef _incident;
  bool _hasLine;
  std::vector<std::uint64_t> _affected;
  std::string _said;
  Gtk::Box _box{Gtk::Orientation::VERTICAL, 6};
  Gtk::Box _affectedLines{Gtk::Orientation::VERTICAL, 4};
  Gtk::Box _asOf;
  std::shared_ptr<IncidentImages::Request> _image;
};

/// A card for each of some incidents, those that are in force first. What they affect is looked up in the feeds by and
/// by. A card that comes into view has been seen.
class IncidentCards final : public Gtk::ListBox {
 public:
  /// `line` is the line whose incidents they are; absent for a list over lines.
  IncidentCards(const PageContext& context, const TransitIncidents& incidents, std::optional<std::uint64_t> line);

 private:
  void lookUpLines(const PageContext& context, const TransitIncidents& incidents);
  void watchView();
  /// NO before there is anything to see.
  bool markWhatIsInView();

  const PageContext& _context;
  std::vector<IncidentCard*> _cards;
  std::set<std::string> _marked;  // by their numbers
  std::shared_ptr<WidgetHostProcess::Question> _lookup;
};

}  // namespace nimbo
