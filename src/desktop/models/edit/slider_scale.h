#pragma once

#include <cstdint>

#include "operations/parameter.h"

namespace fotomill::desktop {

// Sliders for numbers; positions are 0 to kSliderEnd. Wide ranges are spread, so that small numbers
// get most of the slider.
inline constexpr int32_t kSliderEnd = 1000;

// Whether a parameter is a number with both limits.
bool IsNumber(const Parameter& row);  // integer, number, percent or angle
bool HasSlider(const Parameter& row);

int32_t SliderPosition(const Parameter& row, double value);
// Rounded to the parameter's digits.
double SliderValue(const Parameter& row, int32_t position);
// Digits after the point in a field, and the step of its arrows.
int DigitsOf(const Parameter& row);
double StepOf(const Parameter& row);
// A number as in a recipe.
std::string NumberText(const Parameter& row, double value);

}  // namespace fotomill::desktop
