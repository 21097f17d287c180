// The form that the objects share: a question for each thing, its report filled by the answer, and
// the verbs that list or show them.
#pragma once

#include "objects.h"

#include <functional>
#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace zavctl {

// A question whose report begins as `begin`; `ask` makes the answered one of it in a thread of its
// own and must hold all it needs by value.
template <class Report, class Ask>
Question question(const std::string &about, const Report &begin, const Shared<Report> &reports,
                  const Ask &ask) {
    const std::size_t index = reports->size();
    reports->push_back(begin);
    return {about, [begin, index, reports, ask] {
                return [report = ask(begin), index, reports] { (*reports)[index] = report; };
            }};
}

template <class Id, class MakeQuestion>
std::vector<Question> questions_of(const std::vector<Id> &ids, const MakeQuestion &make) {
    std::vector<Question> questions;
    questions.reserve(ids.size());
    for (const Id &id : ids)
        questions.push_back(make(id));
    return questions;
}

template <class Report>
Shared<Report> no_reports() {
    return std::make_shared<std::vector<Report>>();
}

// A verb without operands.
inline Command add_list(Command object, Session &session, const VerbHelp &help,
                        std::function<Answer(Session &)> answer) {
    const Command verb = add_verb(object, session, "list", help);
    verb.callback([&session, answer = std::move(answer)] {
        session.action = [&session, answer] { return answer(session); };
    });
    return verb;
}

// A verb that is told what to show.
struct Operand {
    const char *name;
    const char *meaning;
};
template <class Value>
CommandOption add_show(Command object, Session &session, const VerbHelp &help,
                       const Operand &operand,
                       std::function<Answer(Session &, const std::vector<Value> &)> answer) {
    const auto values = std::make_shared<std::vector<Value>>();
    const Command verb = add_verb(object, session, "show", help);
    verb.callback([&session, values, answer = std::move(answer)] {
        session.action = [&session, values, answer] { return answer(session, *values); };
    });
    return verb.add_option(operand.name, *values, operand.meaning).required();
}

// What each word means; `meant` gives none for a word that it does not know, which is told to be
// `what`.
template <class Id, class Meaning>
std::vector<Id> ids_of(const std::vector<std::string> &words, const Meaning &meant,
                       const std::string &what) {
    std::vector<Id> ids;
    for (const std::string &word : words) {
        const std::optional<Id> id = meant(word);
        if (!id)
            throw UsageError("'" + printable(word) + "' is " + what);
        ids.push_back(*id);
    }
    return ids;
}

} // namespace zavctl
