-- The three tables of JobLink's database that KEST2 writes, for setting up JobLink.
-- The newJob row of a complete job has Status 1. A row with Status 0 is being written, or its export has failed.

CREATE TABLE newJob (
    nJobID_PK INT UNSIGNED NOT NULL AUTO_INCREMENT,
    Status TINYINT NOT NULL DEFAULT 0,
    PRIMARY KEY (nJobID_PK)
) ENGINE = InnoDB DEFAULT CHARSET = utf8mb4;

CREATE TABLE newJobHdr (
    nJobHdr_PK INT UNSIGNED NOT NULL AUTO_INCREMENT,
    nJobID_FK INT UNSIGNED NOT NULL,
    JobNr VARCHAR(20),
    estNr VARCHAR(20),
    estimateDate VARCHAR(30),
    startDate DATETIME,
    endDate DATETIME,
    invoiceDate VARCHAR(30),
    paintType VARCHAR(10),
    insName VARCHAR(100),
    insAddr VARCHAR(255),
    insPcode VARCHAR(50),
    insContact VARCHAR(100),
    insPh VARCHAR(50),
    insMob VARCHAR(50),
    insFax VARCHAR(50),
    insEmail VARCHAR(100),
    insPolicyNr VARCHAR(50),
    insClaimNr VARCHAR(50),
    custName VARCHAR(150),
    custAddr VARCHAR(255),
    custPcode VARCHAR(50),
    custPh VARCHAR(50),
    custMob VARCHAR(50),
    custFax VARCHAR(50),
    custEmail VARCHAR(100),
    vehReg VARCHAR(20),
    vehMake VARCHAR(50),
    vehModel VARCHAR(100),
    vehVIN VARCHAR(50),
    vehColor VARCHAR(50),
    vehColorCode VARCHAR(20),
    vehTrans VARCHAR(50),
    vehYear VARCHAR(10),
    vehMonth VARCHAR(10),
    estimator VARCHAR(50),
    assessor VARCHAR(100),
    jobNotes TEXT,
    PRIMARY KEY (nJobHdr_PK),
    KEY (nJobID_FK)
) ENGINE = InnoDB DEFAULT CHARSET = utf8mb4;

CREATE TABLE newJobDtl (
    nJobDtlID_PK INT UNSIGNED NOT NULL AUTO_INCREMENT,
    nJobID_FK INT UNSIGNED NOT NULL,
    coreTitle VARCHAR(10),
    lineDescn TEXT,
    lineSale DECIMAL(12, 2),
    lineCost DECIMAL(12, 2),
    lineNr INT,
    linePartNr VARCHAR(50),
    linePartQty DOUBLE,
    linePartType VARCHAR(20),
    lineSupplierName VARCHAR(100),
    PRIMARY KEY (nJobDtlID_PK),
    KEY (nJobID_FK)
) ENGINE = InnoDB DEFAULT CHARSET = utf8mb4;
