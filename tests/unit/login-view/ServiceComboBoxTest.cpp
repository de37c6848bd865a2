#include "support/LoginTest.h"

#include <LumoraKit/platform/KTServiceComboBox.h>

using lumora::TextRecord;
using lumora::textRecordWithStrings;
using lumora::fakes::FakeComboBox;
using lumora::fakes::OrderList;
using testing::ElementsAre;
using testing::IsEmpty;

namespace {

struct Delegate : KTServiceComboBoxDelegate {
  void comboBoxSelectionDidChange(const std::shared_ptr<KTServiceComboBox>& comboBox) override {
    told.push_back("selection " + comboBox->selectedServiceName().value_or("none"));
  }
  void controlTextDidChange(const std::shared_ptr<lumora::TextField>& field) override {
    told.push_back("text " + field->stringValue());
  }
  std::vector<std::string> told;
};

class ServiceComboBoxTest : public lumora::tests::LoginTest {
protected:
  ServiceComboBoxTest() {
    comboBox_->setAction([this] { delegate_->told.emplace_back("action"); });
  }

  void start() { comboBox_->startBrowsing(delegate_); }
  void type(const std::string& text) {
    field_->show(text);
    comboBox_->userChangedText();
  }
  lumora::fakes::FakeServiceDiscovery& network() { return *platform_.serviceDiscovery; }

  std::shared_ptr<FakeComboBox> field_ = std::make_shared<FakeComboBox>("field", std::make_shared<OrderList>());
  std::shared_ptr<KTServiceComboBox> comboBox_ = std::make_shared<KTServiceComboBox>(field_);
  std::shared_ptr<Delegate> delegate_ = std::make_shared<Delegate>();
};

TEST_F(ServiceComboBoxTest, lists_whatIsThereAndWhatComes) {
  network().add("Studio 1");
  start();
  EXPECT_THAT(field_->items(), IsEmpty());
  run();
  network().add("Studio 2");
  EXPECT_THAT(field_->items(), ElementsAre("Studio 1", "Studio 2"));
  EXPECT_EQ(comboBox_->discoveredNetServices().size(), 2U);
  EXPECT_THAT(delegate_->told, IsEmpty());
}

TEST_F(ServiceComboBoxTest, lists_eachNameOnce) {
  start();
  const auto first = network().add("Studio");
  const auto second = network().add("Studio");
  EXPECT_THAT(field_->items(), ElementsAre("Studio"));
  network().remove(first);
  EXPECT_THAT(field_->items(), ElementsAre("Studio"));
  network().remove(second);
  EXPECT_THAT(field_->items(), IsEmpty());
}

TEST_F(ServiceComboBoxTest, choice_isToldAndShown) {
  start();
  network().add("Studio");
  comboBox_->userChoseItem("Studio");
  EXPECT_THAT(delegate_->told, ElementsAre("selection Studio"));
  EXPECT_EQ(comboBox_->stringValue(), "Studio");
}

TEST_F(ServiceComboBoxTest, choice_isLost_whenTextIsTypedOrSet) {
  start();
  comboBox_->userChoseItem("Studio");
  type("Studio");
  EXPECT_EQ(comboBox_->selectedServiceName(), std::nullopt);
  comboBox_->userChoseItem("Studio");
  comboBox_->setStringValue("Studio");
  EXPECT_EQ(comboBox_->selectedServiceName(), std::nullopt);
}

TEST_F(ServiceComboBoxTest, textAndChoice_stay_whenServicesComeAndGo) {
  start();
  const auto service = network().add("Studio");
  comboBox_->userChoseItem("Studio");
  network().remove(service);
  EXPECT_EQ(comboBox_->selectedServiceName(), "Studio");
  type("half typ");
  for (int i = 0; i < 500; ++i) {
    network().remove(network().add("Studio " + std::to_string(i)));
  }
  EXPECT_EQ(comboBox_->stringValue(), "half typ");
}

TEST_F(ServiceComboBoxTest, action_runsOnce_afterEachEdit) {
  start();
  comboBox_->userFinishedEditing();
  type("a");
  comboBox_->userFinishedEditing();
  comboBox_->userFinishedEditing();
  EXPECT_THAT(delegate_->told, ElementsAre("text a", "action"));
}

TEST_F(ServiceComboBoxTest, action_doesNotRun_afterAChoiceOrTheEndOfEditing) {
  start();
  type("a");
  comboBox_->userChoseItem("Studio");
  comboBox_->userFinishedEditing();
  type("b");
  comboBox_->endEditing();
  comboBox_->userFinishedEditing();
  EXPECT_THAT(delegate_->told, ElementsAre("text a", "selection Studio", "text b"));
}

TEST_F(ServiceComboBoxTest, stop_endsOnlyWhatThisDelegateStarted) {
  start();
  comboBox_->stopBrowsing(std::make_shared<Delegate>());
  EXPECT_EQ(network().browserCount(), 1U);
  comboBox_->stopBrowsing(delegate_);
  EXPECT_EQ(network().browserCount(), 0U);
}

TEST_F(ServiceComboBoxTest, stop_keepsListAndDelegate) {
  start();
  network().add("Studio");
  comboBox_->stopBrowsing(delegate_);
  network().add("Other");
  EXPECT_THAT(field_->items(), ElementsAre("Studio"));
  type("a");
  EXPECT_THAT(delegate_->told, ElementsAre("text a"));
}

TEST_F(ServiceComboBoxTest, start_beginsAnew) {
  start();
  network().add("Studio");
  start();
  EXPECT_EQ(network().browserCount(), 1U);
  EXPECT_THAT(field_->items(), IsEmpty());
  run();
  EXPECT_THAT(field_->items(), ElementsAre("Studio"));
}

TEST_F(ServiceComboBoxTest, search_ends_whenTheComboBoxDies) {
  start();
  network().add("Studio");
  comboBox_.reset();
  EXPECT_EQ(network().browserCount(), 0U);
  network().add("Other");
}

TEST(TextRecordTest, strings_areSplitAtTheFirstEqualsSign) {
  EXPECT_EQ(textRecordWithStrings({"host=a=b", "empty=", "absent", "=lost", ""}),
            (TextRecord{{"host", "a=b"}, {"empty", ""}, {"absent", std::nullopt}}));
}

TEST(TextRecordTest, keys_areComparedWithoutCaseAndTheFirstCounts) {
  EXPECT_EQ(textRecordWithStrings({"HOST=a", "host=b", "port", "Port=1"}),
            (TextRecord{{"host", "a"}, {"port", std::nullopt}}));
}

TEST(TextRecordTest, values_mayBeAnyBytes) {
  const std::string bytes("\0\xff=", 3);
  EXPECT_EQ(textRecordWithStrings({"host=" + bytes}), (TextRecord{{"host", bytes}}));
}

} // namespace
