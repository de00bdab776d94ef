#include "ValidationOperation.h"

ValidationOperation ValidationOperation::QueryStatus()
{
    return {"QueryStatus", [](auto& provider, auto* list, auto*) { return provider.QueryStatus(list, 0); }};
}

ValidationOperation ValidationOperation::Add(unsigned long options)
{
    return {"Add", [=](auto& provider, auto* list, auto* comment) { return provider.Add(list, comment, options); }};
}

ValidationOperation ValidationOperation::CheckOut(unsigned long options)
{
    return {"CheckOut",
            [=](auto& provider, auto* list, auto* comment) { return provider.CheckOut(list, comment, options); }};
}

ValidationOperation ValidationOperation::CheckIn(unsigned long options)
{
    return {"CheckIn",
            [=](auto& provider, auto* list, auto* comment) { return provider.CheckIn(list, comment, options); }};
}

ValidationOperation ValidationOperation::UndoCheckOut(unsigned long options)
{
    return {"UndoCheckOut", [=](auto& provider, auto* list, auto*) { return provider.UndoCheckOut(list, options); }};
}

ValidationOperation ValidationOperation::GetLatest(unsigned long options)
{
    return {"GetLatest", [=](auto& provider, auto* list, auto*) { return provider.GetLatest(list, options); }};
}

ValidationOperation ValidationOperation::ShowHistory()
{
    return {"ShowHistory", [](auto& provider, auto* list, auto*) { return provider.ShowHistory(list); }};
}

ValidationOperation ValidationOperation::ShowProperties()
{
    return {"ShowProperties", [](auto& provider, auto* list, auto*) { return provider.ShowProperties(list); }};
}

std::vector<ValidationOperation> ValidationOperation::Silent()
{
    return {QueryStatus(), Add(), CheckOut(), UndoCheckOut(), CheckIn(), GetLatest()};
}

std::vector<ValidationOperation> ValidationOperation::Scenario(unsigned long options)
{
    return {QueryStatus(),     Add(options),          QueryStatus(),      CheckOut(options),
            QueryStatus(),     CheckIn(options),      QueryStatus(),      UndoCheckOut(options),
            CheckOut(options), UndoCheckOut(options), GetLatest(options), QueryStatus()};
}

int ValidationOperation::Run(ValidationSubject& subject, ValidationProvider& provider, OrvixFileList* list,
                             const std::string& on, const wchar_t* comment) const
{
    return subject.Call(name + on, [&] { return run(provider.Get(), list, comment); });
}
