-- The journal on MariaDB and MySQL: what each operation changed in the quote database. Its tables need InnoDB.

-- one row for each load, undo, send, save or response that changed something
CREATE TABLE KESTOperation (
    Operation     INTEGER NOT NULL AUTO_INCREMENT PRIMARY KEY,
    OperationKind VARCHAR(10) NOT NULL,
    State         VARCHAR(12) NOT NULL,
    FileName      VARCHAR(255),
    FileHash      VARCHAR(64),
    QTNNO         VARCHAR(20),
    Subquote      VARCHAR(10),
    Workstation   VARCHAR(64),
    ProcessId     INTEGER,
    ServerSession VARCHAR(64),
    LockName      VARCHAR(64),
    StartedAt     DATETIME,
    EndedAt       DATETIME,
    PastPoint     BOOLEAN,
    Facts         LONGTEXT
) ENGINE = InnoDB DEFAULT CHARSET = utf8mb4;
CREATE INDEX KESTOperation_State ON KESTOperation (State);
CREATE INDEX KESTOperation_File ON KESTOperation (FileName);

-- one row for each row of a table that an operation inserted, updated or deleted
CREATE TABLE KESTJournal (
    Entry     INTEGER NOT NULL AUTO_INCREMENT PRIMARY KEY,
    Operation INTEGER NOT NULL,
    ChangedAt DATETIME,
    TableName VARCHAR(64) NOT NULL,
    QTNNO     VARCHAR(20),
    Subquote  VARCHAR(10),
    RowData   LONGTEXT,
    Settled   INTEGER NOT NULL
) ENGINE = InnoDB DEFAULT CHARSET = utf8mb4;
CREATE INDEX KESTJournal_Operation ON KESTJournal (Operation);
CREATE INDEX KESTJournal_Quote ON KESTJournal (QTNNO, Subquote);
