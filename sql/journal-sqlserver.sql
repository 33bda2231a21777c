-- The journal on SQL Server: what each operation changed in the quote database.

-- one row for each load, undo, send, save or response that changed something
CREATE TABLE KESTOperation (
    Operation     INT IDENTITY(1,1) NOT NULL PRIMARY KEY,
    OperationKind NVARCHAR(10) NOT NULL,
    State         NVARCHAR(12) NOT NULL,
    FileName      NVARCHAR(255),
    FileHash      NVARCHAR(64),
    QTNNO         NVARCHAR(20),
    Subquote      NVARCHAR(10),
    Workstation   NVARCHAR(64),
    ProcessId     INTEGER,
    ServerSession NVARCHAR(64),
    LockName      NVARCHAR(64),
    StartedAt     DATETIME,
    EndedAt       DATETIME,
    PastPoint     BIT,
    Facts         NVARCHAR(MAX)
);
CREATE INDEX KESTOperation_State ON KESTOperation (State);
CREATE INDEX KESTOperation_File ON KESTOperation (FileName);

-- one row for each row of a table that an operation inserted, updated or deleted
CREATE TABLE KESTJournal (
    Entry     INT IDENTITY(1,1) NOT NULL PRIMARY KEY,
    Operation INTEGER NOT NULL,
    ChangedAt DATETIME,
    TableName NVARCHAR(64) NOT NULL,
    QTNNO     NVARCHAR(20),
    Subquote  NVARCHAR(10),
    RowData   NVARCHAR(MAX),
    Settled   INTEGER NOT NULL
);
CREATE INDEX KESTJournal_Operation ON KESTJournal (Operation);
CREATE INDEX KESTJournal_Quote ON KESTJournal (QTNNO, Subquote);
