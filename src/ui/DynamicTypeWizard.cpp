#include "ui/DynamicTypeWizard.h"

#include "platform/Platform.h"
#include "platform/ui/Environment.h"
#include "platform/ui/View.h"

namespace nimbo {

double DynamicTypeValue::scaledValue() const {
  const FontRef font = _fontProvider ? _fontProvider() : nullptr;
  return font ? font->_scaledValueForValue(_unscaledValue) : _unscaledValue;
}

namespace {

void scaleSpacing(StackView& stackView, const DynamicTypeValue& value) {
  stackView.setSpacing(roundToViewScale(value.scaledValue(), &stackView));
}

}  // namespace

void ScaleConstraintToDynamicValue(LayoutConstraint& constraint, const DynamicTypeValue& value) {
  const auto first = constraint.firstItem();
  constraint.setConstant(roundToViewScale(value.scaledValue(), first ? first->owningView() : nullptr));
}

void MakeObjectsPerformSelectorWithMap(const DynamicTypeWizard::SelectorMap& map) {
  for (const auto& [object, selector] : map.snapshot())
    if (object->respondsToOperation(selector)) object->performOperation(selector);
}

std::shared_ptr<DynamicTypeWizard> DynamicTypeWizard::_singletonInstance() {
  // Asked for here: making one singleton must not ask for another.
  Environment& environment = Environment::current();
  return Platform::current().singleton<DynamicTypeWizard>([&environment] { return init(environment); });
}

std::shared_ptr<DynamicTypeWizard> DynamicTypeWizard::init(Environment& environment) {
  std::shared_ptr<DynamicTypeWizard> wizard(new DynamicTypeWizard);
  environment.observeContentSizeCategory(wizard, [raw = wizard.get()] { raw->_contentSizeCategoryDidChange(); });
  return wizard;
}

void DynamicTypeWizard::autorefreshLabel_withFontProvider(const std::shared_ptr<StyledLabel>& label,
                                                          FontProvider fontProvider) {
  if (!fontProvider) return;
  label->setFont(fontProvider());
  _singletonInstance()->_labelToFontMap.setObject_forKey(std::move(fontProvider), label);
}

LayoutConstraintRef DynamicTypeWizard::autoscaledConstraint_constant_withFontProvider(
    const LayoutConstraintRef& constraint, double constant, FontProvider fontProvider) {
  if (!fontProvider) return constraint;
  auto value = std::make_shared<DynamicTypeValue>(constant, std::move(fontProvider));
  ScaleConstraintToDynamicValue(*constraint, *value);
  _singletonInstance()->_constraintToValueMap.setObject_forKey(std::move(value), constraint);
  return constraint;
}

void DynamicTypeWizard::updateUnscaledConstantValue_fontProvider_forConstraint(double constant,
                                                                               FontProvider fontProvider,
                                                                               const LayoutConstraintRef& constraint) {
  const auto* value = _singletonInstance()->_constraintToValueMap.objectForKey(constraint.get());
  if (!value) return;
  (*value)->setUnscaledValue(constant);
  (*value)->setFontProvider(std::move(fontProvider));
  ScaleConstraintToDynamicValue(*constraint, **value);
}

void DynamicTypeWizard::autoscaleStackView_spacing_withFontProvider(const std::shared_ptr<StackView>& stackView,
                                                                    double spacing, FontProvider fontProvider) {
  if (!fontProvider) return;
  auto value = std::make_shared<DynamicTypeValue>(spacing, std::move(fontProvider));
  scaleSpacing(*stackView, *value);
  _singletonInstance()->_stackToValueMap.setObject_forKey(std::move(value), stackView);
}

void DynamicTypeWizard::makeObject_performSelector_whenSizeCategoryChangesWithOrder(
    const std::shared_ptr<Object>& object, const std::string& selector, std::uint64_t order) {
  auto& tables = _singletonInstance()->_objectToSelectorStringTables;
  const auto table = tables.find(order);
  if (table != tables.end() && object->respondsToOperation(selector)) table->second.setObject_forKey(selector, object);
}

void DynamicTypeWizard::unregisterObject(const Object& object) {
  for (auto& [order, table] : _singletonInstance()->_objectToSelectorStringTables) table.removeObjectForKey(&object);
}

void DynamicTypeWizard::_contentSizeCategoryDidChange() {
  for (const auto& [label, fontProvider] : _labelToFontMap.snapshot()) label->setFont(fontProvider());
  MakeObjectsPerformSelectorWithMap(_objectToSelectorStringTables.at(0));
  for (const auto& [constraint, value] : _constraintToValueMap.snapshot())
    ScaleConstraintToDynamicValue(*constraint, *value);
  for (const auto& [stackView, value] : _stackToValueMap.snapshot()) scaleSpacing(*stackView, *value);
  MakeObjectsPerformSelectorWithMap(_objectToSelectorStringTables.at(1));
  MakeObjectsPerformSelectorWithMap(_objectToSelectorStringTables.at(2));
}

}  // namespace nimbo
