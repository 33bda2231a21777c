-- The journal on the embedded engine: what each operation changed in the quote database.

-- one row for each load, undo, send, save or response that changed something
CREATE TABLE KESTOperation (
    Operation     INTEGER PRIMARY KEY AUTOINCREMENT,
    OperationKind VARCHAR(10) COLLATE NOCASE NOT NULL,
    State         VARCHAR(12) COLLATE NOCASE NOT NULL,
    FileName      VARCHAR(255) COLLATE NOCASE,
    FileHash      VARCHAR(64) COLLATE NOCASE,
    QTNNO         VARCHAR(20) COLLATE NOCASE,
    Subquote      VARCHAR(10) COLLATE NOCASE,
    Workstation   VARCHAR(64) COLLATE NOCASE,
    ProcessId     INTEGER,
    ServerSession VARCHAR(64) COLLATE NOCASE,
    LockName      VARCHAR(64) COLLATE NOCASE,
    StartedAt     DATETIME,
    EndedAt       DATETIME,
    PastPoint     BOOLEAN,
    Facts         LONGTEXT COLLATE NOCASE
);
CREATE INDEX KESTOperation_State ON KESTOperation (State);
CREATE INDEX KESTOperation_File ON KESTOperation (FileName);

-- one row for each row of a table that an operation inserted, updated or deleted
CREATE TABLE KESTJournal (
    Entry     INTEGER PRIMARY KEY AUTOINCREMENT,
    Operation INTEGER NOT NULL,
    ChangedAt DATETIME,
    TableName VARCHAR(64) COLLATE NOCASE NOT NULL,
    QTNNO     VARCHAR(20) COLLATE NOCASE,
    Subquote  VARCHAR(10) COLLATE NOCASE,
    RowData   LONGTEXT COLLATE NOCASE,
    Settled   INTEGER NOT NULL
);
CREATE INDEX KESTJournal_Operation ON KESTJournal (Operation);
CREATE INDEX KESTJournal_Quote ON KESTJournal (QTNNO, Subquote);
