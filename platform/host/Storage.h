/// What a host is kept in. Its words are the host's own as well: who builds on the host says host::Record.
#pragma once

#include "store/Error.h"
#include "store/Files.h"
#include "store/Record.h"
#include "store/Store.h"
#include "store/Text.h"

namespace host {

using namespace store;

}  // namespace host
