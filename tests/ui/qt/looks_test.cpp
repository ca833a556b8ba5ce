// SPDX-License-Identifier: Apache-2.0
#include <QColor>
#include <QFontMetricsF>
#include <QImage>
#include <algorithm>
#include <cmath>
#include <map>

#include "tests/ui/qt/window_testing.h"

namespace probeview {
namespace {

// Relative luminance and contrast as the Web Content Accessibility Guidelines 2.1 define them.
double luminance(const QColor& color) {
  const auto linear = [](double channel) {
    return channel <= 0.04045 ? channel / 12.92 : std::pow((channel + 0.055) / 1.055, 2.4);
  };
  return 0.2126 * linear(color.redF()) + 0.7152 * linear(color.greenF()) + 0.0722 * linear(color.blueF());
}
double contrast(const QColor& one, const QColor& other) {
  const double lighter = std::max(luminance(one), luminance(other));
  const double darker = std::min(luminance(one), luminance(other));
  return (lighter + 0.05) / (darker + 0.05);
}

class WindowLooks : public testing_ui::WindowTest {
 protected:
  QColor color(const char* name) { return theme().property(name).value<QColor>(); }
  double number(const char* name) { return theme().property(name).toDouble(); }
  QQuickItem* whole() { return window().contentItem(); }

  void setLook(bool dark, double scale) {
    theme().setProperty("dark", dark);
    theme().setProperty("textScale", scale);
    rest();
  }

  // Every text in sight is drawn whole, inside the window's width and inside its row, and none lies on another.
  void expectNothingClipped() {
    const auto texts = textsIn(whole());
    for (auto* text : texts) {
      const std::string what = textOf(text);
      EXPECT_FALSE(text->property("truncated").toBool()) << what;
      EXPECT_LE(text->property("contentWidth").toDouble(), text->width() + 1) << what;
      EXPECT_LE(text->property("contentHeight").toDouble(), text->height() + 1) << what;
      const QRectF place = text->mapRectToScene(text->boundingRect());
      EXPECT_GE(place.left(), 0) << what;
      EXPECT_LE(place.right(), window().width()) << what;
    }
    for (int index = 0; index < model().rowCount(); ++index) {
      QQuickItem* found = nullptr;
      QMetaObject::invokeMethod(list(), "itemAtIndex", Q_RETURN_ARG(QQuickItem*, found), Q_ARG(int, index));
      if (!found) continue;
      EXPECT_GE(found->height(), 48);
      QRectF label;
      for (auto* text : textsIn(found)) {
        if (textOf(text).empty()) continue;
        const QRectF place = text->mapRectToItem(found, text->boundingRect());
        EXPECT_GE(place.top(), 0) << textOf(text);
        EXPECT_LE(place.bottom(), found->height()) << textOf(text);
        // The box of a text spans the row; what counts is where its letters are.
        const double letters = text->property("contentWidth").toDouble();
        const bool right = text->property("effectiveHorizontalAlignment").toInt() == Qt::AlignRight;
        const QRectF drawn(right ? place.right() - letters : place.left(), place.top(), letters, place.height());
        EXPECT_FALSE(drawn.intersects(label)) << textOf(text);
        label = drawn;
      }
      auto* stroke = part(found, "missing");
      if (!stroke->isVisible()) continue;
      const QRectF place = stroke->mapRectToItem(found, stroke->boundingRect());
      EXPECT_TRUE(QRectF(0, 0, found->width(), found->height()).contains(place)) << "the stroke of row " << index;
      // Far enough from the letters to be no part of them.
      EXPECT_FALSE(place.adjusted(-6, -6, 6, 6).intersects(label)) << "the stroke of row " << index;
    }
  }

  // Around the item the picture shows nothing but the card.
  void expectAloneInThePicture(QQuickItem* item) {
    const QImage picture = window().grabWindow();
    const QRect place = item->mapRectToScene(item->boundingRect()).toAlignedRect();
    const QRect around = place.adjusted(-4, -4, 4, 4);
    ASSERT_TRUE(picture.rect().contains(around));
    EXPECT_NE(picture.pixelColor(place.center()), color("card")) << "the item itself is drawn";
    for (int y = around.top(); y <= around.bottom(); ++y) {
      for (int x = around.left(); x <= around.right(); ++x) {
        if (place.contains(x, y)) continue;
        ASSERT_EQ(picture.pixelColor(x, y), color("card")) << x << ", " << y;
      }
    }
  }
};

TEST_F(WindowLooks, EveryTextStandsOutFromItsGroundInBothLooks) {
  show();
  for (const bool dark : {false, true}) {
    theme().setProperty("dark", dark);
    const auto pairs = theme().property("textPairs").value<QVariantList>();
    ASSERT_GT(pairs.size(), 20);
    for (const auto& pair : pairs) {
      const auto text = pair.toList().at(0).value<QColor>();
      const auto ground = pair.toList().at(1).value<QColor>();
      EXPECT_GE(contrast(text, ground), 4.5)
          << text.name().toStdString() << " on " << ground.name().toStdString() << (dark ? ", dark" : ", light");
    }
  }
}

TEST_F(WindowLooks, EveryTextInSightHasAColourOfTheTestedPairs) {
  store.filled[DisplayDictionary::myLTERRCStateDict] = testing_ui::dictionaryOf(3);
  show();
  const auto expectTested = [this] {
    std::vector<QColor> tested;
    for (const auto& pair : theme().property("textPairs").value<QVariantList>()) {
      tested.push_back(pair.toList().at(0).value<QColor>());
    }
    for (auto* text : textsIn(whole())) {
      EXPECT_NE(std::find(tested.begin(), tested.end(), text->property("color").value<QColor>()), tested.end())
          << textOf(text);
    }
  };
  expectTested();
  goTo("LTE", "RRC State");
  for (const bool dark : {false, true}) {
    setLook(dark, 1);
    expectTested();
  }
  for (std::size_t index = 0; index < statusKindNames.size(); ++index) {
    statusKind = static_cast<Status::Kind>(index);
    show();
    expectTested();
  }
}

TEST_F(WindowLooks, ThePictureFollowsTheLookAtOnce) {
  show();
  for (const bool dark : {true, false, true}) {
    setLook(dark, 1);
    const QImage picture = window().grabWindow();
    EXPECT_EQ(picture.pixelColor(180, 600), color("ground")) << "below the last row";
    EXPECT_EQ(picture.pixelColor(350, 700), color("bar")) << "right of the status line's words";
    EXPECT_EQ(luminance(picture.pixelColor(180, 600)) < 0.5, dark);
  }
}

TEST_F(WindowLooks, TextsAreDrawnAndNotOnlyLaidOut) {
  show();
  for (const bool dark : {false, true}) {
    setLook(dark, 1);
    const QImage picture = window().grabWindow();
    auto* label = part(row("Device Info"), "label");
    const QRect place =
        label->mapRectToScene({0, 0, label->property("contentWidth").toDouble(), label->height()}).toAlignedRect();
    double most = 1;
    for (int y = place.top(); y < place.bottom(); ++y) {
      for (int x = place.left(); x < place.right(); ++x) {
        most = std::max(most, contrast(picture.pixelColor(x, y), color("card")));
      }
    }
    EXPECT_GE(most, 4.5);
  }
}

TEST_F(WindowLooks, NothingIsClippedAtTwiceTheTextSize) {
  Dictionary state = testing_ui::dictionaryOf(2);
  state.set("rrc_connection_release_cause", Value::text("KLTE_RRC_CONN_RELEASE_CAUSE_LOAD_BALANCING_TAU_REQUIRED"));
  state.set("several_lines",
            Value::text("the first line\nthe second line, which is longer than the first one\nthe third"));
  state.set("a_single_word_that_is_much_longer_than_any_screen_of_a_phone_is_wide",
            Value::text("ABCDEFGHIJKLMNOPQRSTUVWXYZABCDEFGHIJKLMNOPQRSTUVWXYZ"));
  store.filled[DisplayDictionary::myLTERRCStateDict] = state;
  statusText = "Baseband service away since 12:03:10, showing what was last known";
  for (const QSize size : {QSize(360, 720), QSize(1280, 800)}) {
    SCOPED_TRACE(size.width());
    show(size);
    setLook(true, 2);
    EXPECT_EQ(part(row("LTE"), "label")->property("font").value<QFont>().pixelSize(), 30);
    expectNothingClipped();
    clickRow("LTE");
    rest();
    expectNothingClipped();
    clickRow("RRC State");
    rest();
    expectNothingClipped();
    scrollTo(600);
    expectNothingClipped();
  }
}

TEST_F(WindowLooks, NothingIsClippedOnAnyCategoryListAtAnySize) {
  show();
  for (const auto* technology : {"LTE", "UMTS", "GSM"}) {
    clickRow(technology);
    rest();
    for (const double scale : {0.8, 1.0, 1.3, 2.0}) {
      setLook(false, scale);
      expectNothingClipped();
    }
    press(Qt::Key_Escape);
    rest();
  }
}

TEST_F(WindowLooks, ValuesStandBesideTheirLabelsOrBelowThemWhenLong) {
  Dictionary state;
  state.set("state", Value::text("SHORT"));
  state.set("prev_rrc_state", Value::text("KLTE_RRC_CONN_STATE_CONNECTED_AND_MORE"));
  store.filled[DisplayDictionary::myLTERRCStateDict] = state;
  show();
  goTo("LTE", "RRC State");
  const auto gapBelow = [this](const std::string& label) {
    return part(row(label), "value")->y() - part(row(label), "label")->y();
  };
  EXPECT_LT(std::abs(gapBelow("state")), 4);
  EXPECT_GT(gapBelow("prev_rrc_state"), 12);
  window().resize(1280, 800);
  rest();
  EXPECT_LT(std::abs(gapBelow("prev_rrc_state")), 4);
}

TEST_F(WindowLooks, RowsAreAtLeast48PixelsHighAndGrowWithTheirText) {
  Dictionary state;
  state.set("short", Value::text("1"));
  state.set("long", Value::text("one\ntwo\nthree\nfour"));
  store.filled[DisplayDictionary::myLTERRCStateDict] = state;
  show();
  goTo("LTE", "RRC State");
  EXPECT_EQ(row("short")->height(), 48);
  EXPECT_GT(row("long")->height(), 90);
}

TEST_F(WindowLooks, ALongNameBreaksBehindAnUnderscoreAndIsNeverCut) {
  Dictionary state;
  const std::string name = "KLTE_RRC_CONN_RELEASE_CAUSE_LOAD_BALANCING_TAU_REQUIRED";
  state.set("cause", Value::text(name));
  store.filled[DisplayDictionary::myLTERRCStateDict] = state;
  show();
  goTo("LTE", "RRC State");
  auto* value = part(row("cause"), "value");
  EXPECT_EQ(textOf(value), name);
  EXPECT_EQ(value->property("lineCount").toInt(), 2);
  EXPECT_FALSE(value->property("truncated").toBool());
}

TEST_F(WindowLooks, TextThatLooksLikeMarkupIsShownAsItStands) {
  Dictionary state;
  state.set("<b>bold</b>", Value::text("<img src='x'/><h1>big</h1>&amp;"));
  store.filled[DisplayDictionary::myLTERRCStateDict] = state;
  statusText = "<i>status</i>";
  show();
  goTo("LTE", "RRC State");
  constexpr int plainText = 0;  // Text.PlainText
  for (auto* text : textsIn(whole())) EXPECT_EQ(text->property("textFormat").toInt(), plainText) << textOf(text);
  auto* value = part(row("<b>bold</b>"), "value");
  EXPECT_EQ(textOf(value), "<img src='x'/><h1>big</h1>&amp;");
  EXPECT_EQ(row("<b>bold</b>")->property("spoken").toString(), "<b>bold</b>, <img src='x'/><h1>big</h1>&amp;");
}

TEST_F(WindowLooks, AMissingValueLooksMissing) {
  show();
  goTo("LTE", "Serving Cell Info");
  auto* blank = row("");
  EXPECT_TRUE(part(blank, "missing")->isVisible());
  EXPECT_EQ(textOf(part(blank, "label")), "");
  EXPECT_EQ(textOf(part(blank, "value")), "");
  store.filled[DisplayDictionary::myLTESCellInfoDict] = testing_ui::dictionaryOf(1);
  loop.advance(std::chrono::seconds(5));
  EXPECT_FALSE(part(row("field 0"), "missing")->isVisible());
}

TEST_F(WindowLooks, TheStrokeOfAMissingValueNeverTouchesItsLabelAtAnyTextSizeOrWidth) {
  auto page = std::make_unique<testing_ui::HandPage>();
  auto& rows = page->content.sections.emplace_back().rows;
  // Every length from none to several lines, so that at each width some labels end where the stroke would begin.
  const std::string name = "a_name_that_grows_until_it_is_longer_than_the_line_";
  for (std::size_t length = 0; length <= 2 * name.size(); ++length) {
    rows.push_back(testing_ui::valueRow((name + name).substr(0, length), ""));
  }
  rows.push_back(testing_ui::valueRow("names with blanks are wrapped at them, wherever that leads", ""));
  showPage(std::move(page));
  for (const double scale : {0.8, 1.0, 1.3, 1.6, 2.0}) {
    for (const int width : {240, 360, 800}) {
      SCOPED_TRACE(testing::Message() << "scale " << scale << ", width " << width);
      window().resize(width, 720);
      setLook(false, scale);
      int seen = 0;
      for (int index = 0; index < model().rowCount(); index += 4) {
        constexpr int beginning = 0;  // ListView.Beginning
        QMetaObject::invokeMethod(list(), "positionViewAtIndex", Q_ARG(int, index), Q_ARG(int, beginning));
        rest();
        expectNothingClipped();
        QQuickItem* found = nullptr;
        QMetaObject::invokeMethod(list(), "itemAtIndex", Q_RETURN_ARG(QQuickItem*, found), Q_ARG(int, index));
        ASSERT_NE(found, nullptr);
        auto* stroke = part(found, "missing");
        ASSERT_TRUE(stroke->isVisible());
        expectAloneInThePicture(stroke);
        ++seen;
      }
      EXPECT_GT(seen, 20);
    }
  }
}

TEST_F(WindowLooks, TitlesStandOverTheirColumnOnADesk) {
  store.filled[DisplayDictionary::myLTERRCStateDict] = testing_ui::dictionaryOf(2);
  const auto left = [](QQuickItem* item) { return item->mapToScene(QPointF(0, 0)).x(); };
  for (const double scale : {1.0, 2.0}) {
    show({1280, 800});
    setLook(false, scale);
    auto* title = part(whole(), "title");
    EXPECT_GT(left(title), 100);
    EXPECT_EQ(left(title), left(part(row("LTE"), "label")));
    goTo("LTE", "RRC State");
    EXPECT_EQ(left(title), left(part(row("field 0"), "label")));
    EXPECT_EQ(left(part(whole(), "context")), left(title));
    EXPECT_EQ(left(part(whole(), "statusText")), left(title)) << "and the line below the list, too";
    auto* back = part(whole(), "backButton");
    EXPECT_LE(left(back) + back->width(), left(title));
    EXPECT_GE(left(back) + back->width(), left(title) - 8) << "beside the title, not at the window's edge";
  }
  // A phone has no room for that: the button keeps its place at the edge.
  window().resize(360, 720);
  rest();
  EXPECT_EQ(left(part(whole(), "backButton")), 4);
  EXPECT_EQ(left(part(whole(), "title")), 56);
}

TEST_F(WindowLooks, EveryKindOfStatusHasAMarkAndWhatIsAmissAColourOfItsOwn) {
  using Kind = Status::Kind;
  statusText = "the same words for every kind";
  for (const bool dark : {false, true}) {
    // The shape of each mark: which of its pixels differ from the ground, whatever their colour.
    std::map<std::vector<bool>, std::string> shapes;
    std::map<QRgb, std::vector<Kind>> colours;
    for (std::size_t index = 0; index < statusKindNames.size(); ++index) {
      statusKind = static_cast<Kind>(index);
      show();
      setLook(dark, 2);
      const std::string name(statusKindName(statusKind));
      auto* mark = part(whole(), "statusMark");
      const QRect place = mark->mapRectToScene(mark->boundingRect()).toAlignedRect();
      auto* text = part(whole(), "statusText");
      EXPECT_LE(place.right(), text->mapToScene(QPointF(0, 0)).x()) << name;
      EXPECT_GE(place.left(), 0) << name;
      const QImage picture = window().grabWindow();
      std::vector<bool> shape;
      for (int y = place.top(); y <= place.bottom(); ++y) {
        for (int x = place.left(); x <= place.right(); ++x) {
          shape.push_back(contrast(picture.pixelColor(x, y), color("bar")) > 2);
        }
      }
      EXPECT_GT(std::count(shape.begin(), shape.end(), true), 20) << name;
      const auto [same, isNew] = shapes.emplace(std::move(shape), name);
      EXPECT_TRUE(isNew) << name << " looks like " << same->second;
      EXPECT_EQ(mark->property("color").value<QColor>(), text->property("color").value<QColor>()) << name;
      colours[text->property("color").value<QColor>().rgb()].push_back(statusKind);
      EXPECT_EQ(textOf(text), statusText);
    }
    for (const auto kind : {Kind::Stale, Kind::Ended, Kind::Failed, Kind::Away}) {
      const bool isAlone = std::any_of(colours.begin(), colours.end(),
                                       [&](const auto& entry) { return entry.second == std::vector<Kind>{kind}; });
      EXPECT_TRUE(isAlone) << statusKindName(kind) << (dark ? ", dark" : ", light");
    }
  }
}

TEST_F(WindowLooks, LinesStayReadableOnAWideScreen) {
  store.filled[DisplayDictionary::myLTERRCStateDict] = testing_ui::dictionaryOf(2);
  show({2560, 1400});
  goTo("LTE", "RRC State");
  auto* label = part(row("field 0"), "label");
  EXPECT_LE(label->width(), number("columnWidth"));
  EXPECT_NEAR(label->mapToScene(QPointF(label->width() / 2, 0)).x(), 1280, 2) << "in the middle";
}

TEST_F(WindowLooks, TheWindowCanBeAsSmallAsAWatch) {
  show({240, 320});
  goTo("LTE", "EUTRA Neighbor Info");
  expectNothingClipped();
  EXPECT_EQ(window().size(), QSize(240, 320));
}

TEST_F(WindowLooks, DigitsOfValuesHaveEqualWidth) {
  store.filled[DisplayDictionary::myLTERRCStateDict] = testing_ui::dictionaryOf(1);
  show();
  goTo("LTE", "RRC State");
  const auto font = part(row("field 0"), "value")->property("font").value<QFont>();
  const QFontMetricsF metrics(font);
  EXPECT_EQ(metrics.horizontalAdvance(QStringLiteral("111")), metrics.horizontalAdvance(QStringLiteral("888")));
}

}  // namespace
}  // namespace probeview
