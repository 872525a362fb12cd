#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <string>

#include "platform/ui/Font.h"
#include "platform/ui/StackView.h"
#include "platform/ui/StyledLabel.h"
#include "platform/ui/WeakKeyMap.h"
#include "platform/ui/layout/LayoutConstraint.h"

namespace nimbo {

/// Answers the font that a text or a length follows, at the present text size; may answer null.
using FontProvider = std::function<FontRef()>;

/// A length that grows and shrinks with a font. Main thread only.
class DynamicTypeValue final : public Object {
 public:
  /// The length in points at the default text size; the provider may be empty.
  DynamicTypeValue(double unscaledValue, FontProvider fontProvider)
      : _fontProvider(std::move(fontProvider)), _unscaledValue(unscaledValue) {}

  const FontProvider& fontProvider() const { return _fontProvider; }
  void setFontProvider(FontProvider fontProvider) { _fontProvider = std::move(fontProvider); }
  double unscaledValue() const { return _unscaledValue; }
  void setUnscaledValue(double value) { _unscaledValue = value; }

  /// Points, at the font's present size; without a font the unscaled value.
  double scaledValue() const;

  std::string_view className() const override { return "DynamicTypeValue"; }

 private:
  FontProvider _fontProvider;
  double _unscaledValue;
};

/// Keeps fonts and lengths in step with the user's text size. Registrations do not keep objects alive and end with
/// them; registering an object again replaces what was registered. An empty provider registers nothing. One for each
/// platform in force; main thread only.
class DynamicTypeWizard final : public Object {
 public:
  using SelectorMap = WeakKeyMap<Object, std::string>;

  /// Sets the label's font now and after each change.
  static void autorefreshLabel_withFontProvider(const std::shared_ptr<StyledLabel>& label, FontProvider fontProvider);
  /// Sets the constraint's constant, points at the default text size, now and after each change. Answers the
  /// constraint.
  static LayoutConstraintRef autoscaledConstraint_constant_withFontProvider(const LayoutConstraintRef& constraint,
                                                                            double constant, FontProvider fontProvider);
  /// Changes what a registered constraint was registered with; the provider may be empty.
  static void updateUnscaledConstantValue_fontProvider_forConstraint(double constant, FontProvider fontProvider,
                                                                     const LayoutConstraintRef& constraint);
  /// Sets the stack's spacing, points at the default text size, now and after each change.
  static void autoscaleStackView_spacing_withFontProvider(const std::shared_ptr<StackView>& stackView, double spacing,
                                                          FontProvider fontProvider);
  /// Has a named operation performed after each change: in order group 0 after the fonts, in 1 after the lengths too,
  /// in 2 last. One operation for each object and group. Other groups, and operations that the object does not have,
  /// register nothing.
  static void makeObject_performSelector_whenSizeCategoryChangesWithOrder(const std::shared_ptr<Object>& object,
                                                                          const std::string& selector,
                                                                          std::uint64_t order);
  /// Ends the object's operations; fonts and lengths stay registered.
  static void unregisterObject(const Object& object);

  /// Made on first use, by any thread.
  static std::shared_ptr<DynamicTypeWizard> _singletonInstance();

  const WeakKeyMap<StyledLabel, FontProvider>& labelToFontMap() const { return _labelToFontMap; }
  const WeakKeyMap<LayoutConstraint, std::shared_ptr<DynamicTypeValue>>& constraintToValueMap() const {
    return _constraintToValueMap;
  }
  const WeakKeyMap<StackView, std::shared_ptr<DynamicTypeValue>>& stackToValueMap() const { return _stackToValueMap; }
  /// For each order group, 0, 1 and 2, the objects and their operations.
  const std::map<std::uint64_t, SelectorMap>& objectToSelectorStringTables() const {
    return _objectToSelectorStringTables;
  }

  std::string_view className() const override { return "DynamicTypeWizard"; }

 private:
  DynamicTypeWizard() = default;
  static std::shared_ptr<DynamicTypeWizard> init(Environment& environment);
  void _contentSizeCategoryDidChange();

  WeakKeyMap<StyledLabel, FontProvider> _labelToFontMap;
  WeakKeyMap<LayoutConstraint, std::shared_ptr<DynamicTypeValue>> _constraintToValueMap;
  WeakKeyMap<StackView, std::shared_ptr<DynamicTypeValue>> _stackToValueMap;
  std::map<std::uint64_t, SelectorMap> _objectToSelectorStringTables{{0, {}}, {2, {}}, {1, {}}};
};

/// Sets the constant to the value's scaled length, on device pixels of the screen of the constraint's first item.
void ScaleConstraintToDynamicValue(LayoutConstraint& constraint, const DynamicTypeValue& value);

/// Performs each living object's operation, in the order of the map as it is now.
void MakeObjectsPerformSelectorWithMap(const DynamicTypeWizard::SelectorMap& map);

}  // namespace nimbo
