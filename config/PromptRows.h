#pragma once

class OrvixPromptTable;

/// Finds rows of a prompt table by ID, through an index that the table keeps.
struct PromptRows
{
    static constexpr int None = -1;

    /// The first row with an ID; `None` when there is none.
    static int First(const OrvixPromptTable& table, int id);

    /// The last one.
    static int Last(const OrvixPromptTable& table, int id);
};
