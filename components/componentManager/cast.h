// SPDX-License-Identifier: BSL-1.0
/// The whole object model in one header: interface identities, castable objects, references, casts,
/// the templates that implement them, and the exceptions.
#pragma once

#include "components/componentManager/castImpl.h"
#include "components/componentManager/castable.h"
#include "components/componentManager/exceptions.h"
#include "components/componentManager/reference.h"
#include "components/componentManager/translation.h"
#include "components/componentManager/uid.h"
