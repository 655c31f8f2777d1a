/// The keys of operations that answer in another way than by doing their work.
#pragma once

#include "host/TargetSchema.h"

namespace host {

/// What is wrong with a whole record: see KindSpec.
std::string AnswerFault(const Record& answer);

inline constexpr Key kAnswerKeys[] = {
    Text("operation", "The name of the operation.").Required(),
    Text("adapter", "The adapter that it concerns; without it, every one.").Optional(),
    Integer("call", "The call that is answered, from 1, counted in each process; without it, every call.", 1)
        .Optional(),
    Word("throw", "Throws this instead of working.", kThrown).Optional(),
    Text("text", "The text of what is thrown.").Optional(),
    Integer("status", "The iScsiStatus: the work is done, and this returned; with 4 it is not done.")
        .Optional(),
    Integer("imaStatus", "The status of an IMA call; other than 0, the work is not done.", 0, kUint32Most)
        .Optional(),
};

}  // namespace host
