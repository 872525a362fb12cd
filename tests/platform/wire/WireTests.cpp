// Our records against protoc's generated code for the published schema, which knows nothing of ours.

#include <google/protobuf/unknown_field_set.h>
#include <gtest/gtest.h>
#include <nimbo-activity.pb.h>

#include <limits>

#include "handoff/NimboActivity.h"

namespace nimbo {
namespace {

using google::protobuf::FieldDescriptor;
using google::protobuf::Message;

enum class Fill { smallest, largest, zero };

template <class T>
T extreme(Fill fill) {
  if (fill == Fill::zero) return 0;
  return fill == Fill::smallest ? std::numeric_limits<T>::lowest() : std::numeric_limits<T>::max();
}

void fillFields(Message& message, Fill fill);

/// Sets a field with all that is in it, two elements of a repeated one.
void fillField(Message& message, const FieldDescriptor* field, Fill fill) {
  const auto* reflection = message.GetReflection();
  for (int count = field->is_repeated() ? 2 : 1; count > 0; --count) {
    using R = google::protobuf::Reflection;
    const auto setIf = [&](auto type, auto setter, auto adder, auto value) {
      if (field->cpp_type() != type) return;
      if (field->is_repeated())
        (reflection->*adder)(&message, field, value);
      else
        (reflection->*setter)(&message, field, value);
    };
    setIf(FieldDescriptor::CPPTYPE_INT32, &R::SetInt32, &R::AddInt32, extreme<std::int32_t>(fill));
    setIf(FieldDescriptor::CPPTYPE_INT64, &R::SetInt64, &R::AddInt64, extreme<std::int64_t>(fill));
    setIf(FieldDescriptor::CPPTYPE_UINT32, &R::SetUInt32, &R::AddUInt32, extreme<std::uint32_t>(fill));
    // The least unsigned value but 0, which `zero` gives.
    setIf(FieldDescriptor::CPPTYPE_UINT64, &R::SetUInt64, &R::AddUInt64,
          fill == Fill::smallest ? 1 : extreme<std::uint64_t>(fill));
    setIf(FieldDescriptor::CPPTYPE_DOUBLE, &R::SetDouble, &R::AddDouble, extreme<double>(fill));
    setIf(FieldDescriptor::CPPTYPE_BOOL, &R::SetBool, &R::AddBool, fill != Fill::zero);
    if (field->cpp_type() == FieldDescriptor::CPPTYPE_STRING)
      reflection->SetString(&message, field,
                            fill == Fill::zero ? "" : std::string(fill == Fill::largest ? 300 : 1, 'x'));
    if (field->message_type())
      fillFields(field->is_repeated() ? *reflection->AddMessage(&message, field)
                                      : *reflection->MutableMessage(&message, field),
                 fill);
  }
}

void fillFields(Message& message, Fill fill) {
  for (int index = 0; index < message.GetDescriptor()->field_count(); ++index)
    fillField(message, message.GetDescriptor()->field(index), fill);
}

proto::NimboActivity filled(Fill fill) {
  proto::NimboActivity message;
  fillFields(message, fill);
  return message;
}

std::string asText(const Bytes& bytes) { return {bytes.begin(), bytes.end()}; }

std::span<const std::uint8_t> asBytes(const std::string& text) {
  return {reinterpret_cast<const std::uint8_t*>(text.data()), text.size()};
}

bool readInto(NimboActivity& activity, const std::string& text) {
  ProtobufReader reader(asBytes(text));
  return activity.readFrom(reader);
}

/// The present fields by name, as our dictionary representation must have them.
void expectSameFields(const BoxedDictionary& ours, const Message& theirs) {
  std::vector<const FieldDescriptor*> fields;
  theirs.GetReflection()->ListFields(theirs, &fields);
  EXPECT_EQ(ours.entries().size(), fields.size()) << theirs.GetTypeName();
  for (const FieldDescriptor* field : fields) {
    const ObjectRef value = ours.objectForKey(field->name());
    ASSERT_TRUE(value) << field->full_name();
    if (const auto* dictionary = dynamic_cast<const BoxedDictionary*>(value.get()))
      expectSameFields(*dictionary, theirs.GetReflection()->GetMessage(theirs, field));
    const auto* array = dynamic_cast<const BoxedArray*>(value.get());
    if (!array) continue;
    // Repeated fields are arrays, and so are the messages that are lists of elements.
    const Message& holder = field->is_repeated() ? theirs : theirs.GetReflection()->GetMessage(theirs, field);
    const FieldDescriptor* elements = field->is_repeated() ? field : holder.GetDescriptor()->FindFieldByName("element");
    ASSERT_EQ(static_cast<int>(array->elements().size()), holder.GetReflection()->FieldSize(holder, elements));
    for (int index = 0; index < holder.GetReflection()->FieldSize(holder, elements); ++index)
      if (const auto* element =
              dynamic_cast<const BoxedDictionary*>(array->elements()[static_cast<std::size_t>(index)].get()))
        expectSameFields(*element, holder.GetReflection()->GetRepeatedMessage(holder, elements, index));
  }
}

TEST(Wire, EveryFieldIsReadAndWrittenAsTheGeneratedCodeDoes) {
  for (const Fill fill : {Fill::smallest, Fill::largest}) {
    const std::string theirs = filled(fill).SerializeAsString();
    NimboActivity ours;
    ASSERT_TRUE(readInto(ours, theirs));
    EXPECT_EQ(asText(ours.data()), theirs);
    EXPECT_EQ(asText(ours.copyWithZone()->data()), theirs);
    EXPECT_TRUE(ours.isEqual(ours.copyWithZone().get()));
  }
}

/// Calls `visit` with one field after the other, at any depth, first left out and then 0 or empty.
void forEachChange(Message& message, const std::function<void(const FieldDescriptor&)>& visit) {
  std::vector<const FieldDescriptor*> fields;
  const auto* reflection = message.GetReflection();
  reflection->ListFields(message, &fields);
  for (const FieldDescriptor* field : fields) {
    const std::unique_ptr<Message> before(message.New());
    before->CopyFrom(message);
    reflection->ClearField(&message, field);
    visit(*field);
    if (!field->message_type()) {
      fillField(message, field, Fill::zero);
      visit(*field);
    }
    message.CopyFrom(*before);
    if (field->is_repeated() && field->message_type())
      forEachChange(*reflection->MutableRepeatedMessage(&message, field, 1), visit);
    else if (field->message_type())
      forEachChange(*reflection->MutableMessage(&message, field), visit);
  }
}

TEST(Wire, RecordsAndArtworksAreEqualWhereEveryFieldIs) {
  proto::NimboActivity theirs = filled(Fill::largest);
  const std::string artwork = theirs.lineitem().artwork().SerializeAsString();
  NimboActivity ours;
  ASSERT_TRUE(readInto(ours, theirs.SerializeAsString()));
  int changes = 0;
  forEachChange(theirs, [&](const FieldDescriptor& field) {
    ++changes;
    NimboActivity changed;
    ASSERT_TRUE(readInto(changed, theirs.SerializeAsString()));
    EXPECT_FALSE(ours.isEqual(&changed)) << field.full_name();
    EXPECT_FALSE(changed.isEqual(&ours)) << field.full_name();
    if (!theirs.has_lineitem()) return;
    // The colour of a shield's text follows from that of the shield.
    const bool sameArtwork =
        theirs.lineitem().artwork().SerializeAsString() == artwork || field.name() == "shieldTextColorString";
    const TransitArtwork* one = ours.lineItem()->artwork().get();
    const TransitArtwork* other = changed.lineItem()->artwork().get();
    EXPECT_EQ(artworksAreEquivalent(one, other), sameArtwork) << field.full_name();
    EXPECT_EQ(artworksAreEquivalent(other, one), sameArtwork) << field.full_name();
  });
  EXPECT_GT(changes, 200);
  EXPECT_TRUE(ours.hasDisplayOptions() && ours.hasDirectionsPlan() && ours.hasDroppedPin() &&
              ours.hasPresentedMapItem() && ours.hasSearchCategoryStorage() && ours.hasLineItem() &&
              ours.directionsPlan()->hasRouteRequestStorage() && ours.directionsPlan()->hasTransitPreferences());
  EXPECT_TRUE(artworksAreEquivalent(nullptr, nullptr));
  EXPECT_FALSE(ours.isEqual(nullptr));
  EXPECT_FALSE(DroppedPin().isEqual(std::make_shared<StoredMapItem>().get()));
}

TEST(Wire, TheHashOfARecordIsThatOfItsFields) {
  NimboActivity activity;
  activity.setCollectionsMode(-2);
  activity.setIsDroppedPinSelected(true);
  activity.setSearchString("a");
  activity.setDirectionsPlan(std::make_shared<DirectionsPlan>());
  activity.directionsPlan()->setDepartureTime(-2.25);
  activity.directionsPlan()->setArrivalTime(2.75);  // 3 less a quarter: what is negative counts for nothing
  activity.addSearchPlaces(std::make_shared<StoredMapItem>());
  constexpr std::uint64_t kMultiplier = 2654435761, kQuarter = std::uint64_t{1} << 62, kHashOfA = 0xaf63dc4c8601ec8c;
  EXPECT_EQ(activity.hash(),
            (0 - 2 * kMultiplier) ^ kMultiplier ^ kHashOfA ^ (2 * kMultiplier + kQuarter) ^ (3 * kMultiplier) ^ 1);
}

TEST(Wire, ADeepCopySharesNoRecordAndACopyOverARecordSharesAllButTheList) {
  NimboActivity ours, over;
  ASSERT_TRUE(readInto(ours, filled(Fill::largest).SerializeAsString()));
  ours.copyTo(over);
  const auto deep = ours.copyWithZone();
  const auto expectShared = [&](auto recordOf) {
    EXPECT_EQ(recordOf(over), recordOf(ours));
    EXPECT_NE(recordOf(*deep), recordOf(ours));
  };
  expectShared([](const NimboActivity& activity) { return activity.searchPlacesAtIndex(1); });
  expectShared([](const NimboActivity& activity) { return activity.lineItem(); });
  expectShared([](const NimboActivity& activity) { return activity.directionsPlan()->routeRequestStorage(); });
  over.clearSearchPlaces();
  deep->addSearchPlaces(std::make_shared<StoredMapItem>());
  EXPECT_EQ(ours.searchPlacesCount(), 2u);
}

TEST(Wire, ALineItemIsKeptWithWhatItLacks) {
  for (const bool hasIncidents : {true, false}) {
    StoredTransitLineItemFields fields;
    fields.hasIncidentComponent.set(hasIncidents);
    const auto stored = StoredTransitLineItem::initWithLineItem(std::make_shared<StoredTransitLineItem>(fields));
    EXPECT_EQ(stored->hasIncidentComponent(), hasIncidents);
    EXPECT_EQ(stored->muid(), 0u);
  }
}

TEST(Wire, EnumerationsHaveTheirNamesInOrderAndAreZeroWhenAbsent) {
  for (std::int32_t value = -1; value < 5; ++value) {
    const std::string unknown = "(unknown: " + std::to_string(value) + ")";
    const auto expectName = [&](auto nameOf, auto valueOf, const std::vector<std::string>& names) {
      const bool known = value >= 0 && value < static_cast<std::int32_t>(names.size());
      EXPECT_EQ(nameOf(value), known ? names[static_cast<std::size_t>(value)] : unknown);
      EXPECT_EQ(valueOf(nameOf(value)), known ? value : 0);
    };
    expectName(&NimboActivity::collectionsModeAsString, &NimboActivity::StringAsCollectionsMode,
               {"None", "Bookmarks", "Recents", "Contacts"});
    expectName(&DirectionsPlan::displayMethodAsString, &DirectionsPlan::StringAsDisplayMethod,
               {"DirectionsSearch", "RoutePicking", "DirectionsStarted"});
    expectName(&DirectionsPlan::transitPrioritizationAsString, &DirectionsPlan::StringAsTransitPrioritization,
               {"TRANSIT_PRIORITIZE_DEFAULT", "TRANSIT_PRIORITIZE_BY_TRAVEL_TIME",
                "TRANSIT_PRIORITIZE_BY_TRANSFER_COUNT", "TRANSIT_PRIORITIZE_BY_WALKING_DISTANCE"});
  }
  NimboActivity activity;
  activity.setCollectionsMode(3);
  activity.setHasCollectionsMode(false);
  EXPECT_EQ(activity.collectionsMode(), 0);
}

TEST(Wire, NamesOfFieldsAreThoseOfTheSchema) {
  const proto::NimboActivity theirs = filled(Fill::largest);
  NimboActivity ours;
  ASSERT_TRUE(readInto(ours, theirs.SerializeAsString()));
  expectSameFields(*ours.dictionaryRepresentation(), theirs);
}

TEST(Wire, PresentZerosAndEmptyTextsKeepTheirPresence) {
  proto::NimboActivity theirs = filled(Fill::zero);
  theirs.clear_lineitem();  // whose numbers take absence for 0
  NimboActivity ours;
  ASSERT_TRUE(readInto(ours, theirs.SerializeAsString()));
  EXPECT_EQ(asText(ours.data()), theirs.SerializeAsString());
  EXPECT_TRUE(ours.hasSelectedPlaceIndex());
  EXPECT_TRUE(ours.directionsPlan()->hasIsPlayingTrace());
}

TEST(Wire, ASecondMessageReplacesTheFirstAndPlacesAreAppended) {
  proto::NimboActivity first, second;
  first.mutable_directionsplan()->set_originstring("from");
  first.add_searchplaces()->set_name("1");
  second.mutable_directionsplan()->set_destinationstring("to");
  second.add_searchplaces()->set_name("2");
  NimboActivity read;
  ASSERT_TRUE(readInto(read, first.SerializeAsString() + second.SerializeAsString()));
  EXPECT_EQ(asText(read.directionsPlan()->data()), second.directionsplan().SerializeAsString());
  ASSERT_EQ(read.searchPlacesCount(), 2u);
  EXPECT_EQ(asText(read.searchPlacesAtIndex(1)->data()), second.searchplaces(0).SerializeAsString());
}

TEST(Wire, MergingAndCopyingFollowTheGeneratedCode) {
  proto::NimboActivity plan, empty;
  plan.mutable_directionsplan()->set_originstring("from");
  plan.add_searchplaces()->set_name("1");
  const proto::NimboActivity messages[] = {filled(Fill::smallest), filled(Fill::largest), plan, empty};
  for (const proto::NimboActivity& first : messages)
    for (const proto::NimboActivity& second : messages) {
      proto::NimboActivity merged = first;
      merged.MergeFrom(second);
      NimboActivity mine, theirs;
      ASSERT_TRUE(readInto(mine, first.SerializeAsString()) && readInto(theirs, second.SerializeAsString()));
      // A copy over a record has what the other has, places in place of its own.
      const auto copy = mine.copyWithZone();
      theirs.copyTo(*copy);
      EXPECT_EQ(copy->directionsPlan() == theirs.directionsPlan(),
                second.has_directionsplan() || !first.has_directionsplan());
      EXPECT_EQ(copy->searchPlacesCount(), (theirs.searchPlaces() ? theirs : mine).searchPlacesCount());

      mine.mergeFrom(theirs);
      EXPECT_EQ(asText(theirs.data()), second.SerializeAsString()) << "what is merged stays as it is";
      EXPECT_EQ(mine.lineItem() == theirs.lineItem(), !first.has_lineitem()) << "shared where there was none";
      // Inside a line item a list is a value of its own, which is replaced.
      mine.setLineItem(nullptr);
      merged.clear_lineitem();
      EXPECT_EQ(asText(mine.data()), merged.SerializeAsString());
    }
  NimboActivity without, emptied;
  emptied.setSearchPlaces(std::make_shared<NimboActivity::SearchPlaces>());
  without.mergeFrom(emptied);
  EXPECT_FALSE(without.searchPlaces()) << "no element is appended, and no list";
}

TEST(Wire, UnknownFieldsOfEveryKindAreSkippedAndDropped) {
  proto::NimboActivity theirs = filled(Fill::largest);
  const std::string known = theirs.SerializeAsString();
  for (Message* message : {static_cast<Message*>(&theirs), static_cast<Message*>(theirs.mutable_directionsplan()),
                           static_cast<Message*>(theirs.mutable_lineitem()->mutable_incidents(1)),
                           static_cast<Message*>(theirs.mutable_lineitem()->mutable_artwork())}) {
    auto* unknown = message->GetReflection()->MutableUnknownFields(message);
    unknown->AddVarint(20, UINT64_MAX);
    unknown->AddFixed32(21, 1);
    unknown->AddFixed64(536870911, 2);
    unknown->AddLengthDelimited(22, "unknown");
    auto* group = unknown->AddGroup(23);
    group->AddGroup(23)->AddVarint(1, 1);
    group->AddLengthDelimited(24, "in a group");
  }
  NimboActivity ours;
  ASSERT_TRUE(readInto(ours, theirs.SerializeAsString()));
  EXPECT_EQ(asText(ours.data()), known);
}

TEST(Wire, ACutAnywhereIsJudgedAsTheGeneratedCodeJudgesIt) {
  proto::NimboActivity theirs = filled(Fill::smallest);
  theirs.GetReflection()->MutableUnknownFields(&theirs)->AddGroup(30)->AddFixed64(1, 1);
  const std::string whole = theirs.SerializeAsString();
  for (std::size_t length = 0; length <= whole.size(); ++length) {
    const std::string cut = whole.substr(0, length);
    NimboActivity ours;
    ProtobufReader reader(asBytes(cut));
    proto::NimboActivity read;
    EXPECT_EQ(ours.readFrom(reader), read.ParsePartialFromString(cut)) << "at " << length;
    EXPECT_EQ(reader.failureText().empty(), !reader.hasError());
    EXPECT_EQ(static_cast<int>(ours.searchPlacesCount()), read.searchplaces_size()) << "at " << length;
  }
  NimboActivity broken;
  EXPECT_FALSE(readInto(broken, "\x22\x04\x08\x07\x12\x09"));
  ASSERT_EQ(broken.searchPlacesCount(), 1u);
  EXPECT_EQ(asText(broken.searchPlacesAtIndex(0)->data()), "\x08\x07")
      << "a place that breaks off keeps what was read of it";
}

TEST(Wire, ReadingFollowsItsRulesAtTheEdges) {
  const struct {
    const char* name;
    std::string bytes;
    bool read;
    bool hasMode;
    std::int32_t mode;
    const char* failure;
  } cases[] = {
      {"no bytes", "", true, false, 0, ""},
      {"cut in a value", "\x10\xff", false, true, 0, "collectionsMode: the bytes end inside a number, at byte 1"},
      {"cut before a value", "\x10", false, true, 0, "collectionsMode: the bytes end inside a number, at byte 1"},
      {"ten bytes without end are 0", "\x10" + std::string(10, '\xff'), true, true, 0, ""},
      {"a tag without end is an unknown field", std::string(10, '\xff') + std::string("\x01\x10\x02", 3), true, true, 2,
       ""},
      {"the low 32 bits count", std::string("\x10\xff\xff\xff\xff\xff\x01", 7), true, true, -1, ""},
      {"a known field is read as its type", "\x12\x02", true, true, 2, ""},
      {"an end of group ends the record", "\x10\x03\x0c\x10\x02", true, true, 3, ""},
      {"an unknown wire type", "\xf6\x01", false, false, 0, "the wire type is unknown, at byte 2"},
      {"a group that ends as another", std::string("\x83\x01\x8c\x01", 4), false, false, 0,
       "a group is closed that is not open, at byte 4"},
      {"a length beyond the end", "\x10\x01\x1a\x05x", false, true, 1,
       "searchString: the length exceeds the bytes that follow, at byte 3"},
      {"a text that comes again and breaks off", "\x1a\x01x\x1a\x05y", false, false, 0,
       "searchString: the length exceeds the bytes that follow, at byte 4"},
      {"a length beyond the record around it", "\x3a\x02\x12\x05long!", false, false, 0,
       "directionsPlan.originString: the length exceeds the bytes that follow, at byte 3"},
  };
  EXPECT_FALSE(ProtobufReader({}).skipValueWithTag(30, 6));
  for (const auto& test : cases) {
    NimboActivity activity;
    ProtobufReader reader(asBytes(test.bytes));
    EXPECT_EQ(activity.readFrom(reader), test.read) << test.name;
    EXPECT_EQ(activity.hasCollectionsMode(), test.hasMode) << test.name;
    EXPECT_EQ(activity.collectionsMode(), test.mode) << test.name;
    EXPECT_EQ(reader.failureText(), test.failure) << test.name;
  }
}

TEST(Wire, GroupsNestAHundredDeepAndNoDeeper) {
  for (const std::size_t depth : {std::size_t{100}, std::size_t{101}, std::size_t{1000000}}) {
    std::string bytes;
    for (std::size_t i = 0; i < depth; ++i) bytes += "\x83\x01";
    for (std::size_t i = 0; i < depth; ++i) bytes += "\x84\x01";
    NimboActivity activity;
    EXPECT_EQ(readInto(activity, bytes), depth == 100) << depth;
  }
}

}  // namespace
}  // namespace nimbo
