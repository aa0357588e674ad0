// All value records of the property table.
#pragma once

#include "css/values/animation_values.h"
#include "css/values/box_values.h"
#include "css/values/color.h"
#include "css/values/effect_values.h"
#include "css/values/image_values.h"
#include "css/values/keywords.h"
#include "css/values/length.h"
#include "css/values/shape_values.h"
#include "css/values/text_values.h"
#include "css/values/transform_values.h"
