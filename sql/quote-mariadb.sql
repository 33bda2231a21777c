-- The quote database on MariaDB and MySQL: all tables and columns that this component reads or writes.
-- The collation ignores case and trailing blanks, but distinguishes accents.

-- QUOTE1: quote headers; subquote 0 is the main quote
CREATE TABLE QUOTE1 (
    rec_id         INTEGER NOT NULL AUTO_INCREMENT PRIMARY KEY,
    QTNNO          VARCHAR(20),
    Subquote       INTEGER,
    REGO           VARCHAR(20),
    INSURER_ID     INTEGER,
    KESTQRNo       VARCHAR(50),
    KESTQRVer      VARCHAR(20),
    KESTQuoteNo    VARCHAR(50),
    KESTAuthNo     VARCHAR(50),
    AuthDate       DATETIME,
    Claim          VARCHAR(50),
    assess         VARCHAR(100),
    QUOTER         VARCHAR(50),
    qtndate        DATETIME,
    CAR_IN         DATETIME,
    targetdate     DATETIME,
    QSENT          VARCHAR(1),
    Type           VARCHAR(10),
    excess         DOUBLE,
    contri         DOUBLE,
    excess_gst     INTEGER,
    RR_RATE        DOUBLE,
    RA_RATE        DOUBLE,
    paint_rate     DOUBLE,
    NEWPC          DOUBLE,
    SECONDPC       DOUBLE,
    RECOREPC       DOUBLE,
    AFTERPC        DOUBLE,
    RR_TOTAL       DOUBLE,
    RA_TOTAL       DOUBLE,
    PAINT_TOTAL    DOUBLE,
    TOTAL          DOUBLE,
    PRTTOTAL       DOUBLE,
    MISTOTAL       DOUBLE,
    override       DOUBLE,
    rr_override    DOUBLE,
    ra_override    DOUBLE,
    paint_override DOUBLE,
    CONTACTID      INTEGER,
    quotechanged   BOOLEAN,
    invoiced       BOOLEAN,
    ExtraInfo      BOOLEAN,
    Job_stage      INTEGER,
    ReadOnly       BOOLEAN,
    kms            VARCHAR(50),
    msgno          VARCHAR(50),
    policy_no      VARCHAR(50)
) DEFAULT CHARACTER SET utf8mb4 COLLATE utf8mb4_uca1400_as_ci;

-- QUOTE2: the lines of a quote
CREATE TABLE QUOTE2 (
    itemid      INTEGER NOT NULL AUTO_INCREMENT PRIMARY KEY,
    QTNNO       VARCHAR(20),
    Subquote    INTEGER,
    SEQ_NO      INTEGER,
    category    VARCHAR(10),
    script      VARCHAR(100),
    rrhour      DOUBLE DEFAULT 0,
    rahour      DOUBLE DEFAULT 0,
    pthour      DOUBLE DEFAULT 0,
    rr_rate2    DOUBLE DEFAULT 0,
    opg_rate    DOUBLE DEFAULT 0,
    qty         DOUBLE DEFAULT 0,
    unitcost    DOUBLE DEFAULT 0,
    PartNo      VARCHAR(30),
    MARK        VARCHAR(1),
    SIDE        VARCHAR(1),
    VENDOR      INTEGER DEFAULT 0,
    blend       DOUBLE DEFAULT 0,
    Tag         INTEGER,
    delitem     BOOLEAN DEFAULT 0,
    DELETEDITEM INTEGER DEFAULT 0,
    tosend      VARCHAR(1),
    directbill  VARCHAR(1),
    allow_tick  INTEGER,
    Report      BOOLEAN DEFAULT 0,
    Report_on   INTEGER DEFAULT 0,
    itemno      VARCHAR(5)
) DEFAULT CHARACTER SET utf8mb4 COLLATE utf8mb4_uca1400_as_ci;

-- QUOTE3: the long texts of a quote, such as the note chain
CREATE TABLE QUOTE3 (
    QTNNO          VARCHAR(20),
    Subquote       INTEGER,
    remarks        LONGTEXT,
    P_REMARKS      LONGTEXT,
    INCIDENT_NOTES LONGTEXT,
    anno_rr        LONGTEXT,
    anno_ra        LONGTEXT,
    anno_paint     LONGTEXT,
    anno_opg       LONGTEXT,
    anno_part      LONGTEXT,
    anno_misc      LONGTEXT
) DEFAULT CHARACTER SET utf8mb4 COLLATE utf8mb4_uca1400_as_ci;

CREATE TABLE CAR (
    REGO       VARCHAR(20) NOT NULL PRIMARY KEY,
    KEST       INTEGER,
    CUST_ID    INTEGER,
    MODEL_ID   VARCHAR(20),
    BODY_ID    VARCHAR(10),
    BODY_ID2   VARCHAR(10),
    ENGINE     VARCHAR(50),
    ENG_SIZE   VARCHAR(20),
    CYLINDERS  DOUBLE,
    SCHEDULE   VARCHAR(20),
    MTA_SCHED  VARCHAR(20),
    TRI_SCHED  VARCHAR(20),
    UN_SCHED   VARCHAR(20),
    paint_code VARCHAR(20),
    TRIM_CODE  VARCHAR(20),
    OPT_CODE   VARCHAR(20),
    MODEL_NO   VARCHAR(20),
    COLOUR     VARCHAR(50),
    VIN        VARCHAR(50),
    XMission   VARCHAR(50),
    Year       VARCHAR(20),
    PAINT_GP   VARCHAR(2)
) DEFAULT CHARACTER SET utf8mb4 COLLATE utf8mb4_uca1400_as_ci;

CREATE TABLE CUSTOMER (
    CUST_ID    INTEGER NOT NULL AUTO_INCREMENT PRIMARY KEY,
    NAME       VARCHAR(50),
    FIRSTNAME  VARCHAR(50),
    SALUTATION VARCHAR(20),
    Account    INTEGER,
    street     VARCHAR(100),
    suburb     VARCHAR(100),
    PHONE_B    VARCHAR(50),
    PHONE_P    VARCHAR(50),
    mobile     VARCHAR(50),
    Fax        VARCHAR(50),
    email      VARCHAR(100)
) DEFAULT CHARACTER SET utf8mb4 COLLATE utf8mb4_uca1400_as_ci;

CREATE TABLE INSURER (
    INSURER_ID INTEGER NOT NULL AUTO_INCREMENT PRIMARY KEY,
    NAME       VARCHAR(50),
    KEST       BOOLEAN,
    RR_RATE    DOUBLE,
    RA_RATE    DOUBLE,
    S1_RATE    DOUBLE,
    S2_RATE    DOUBLE,
    S3_RATE    DOUBLE,
    M1_RATE    DOUBLE,
    M2_RATE    DOUBLE,
    M3_RATE    DOUBLE,
    new_mu     DOUBLE,
    excess_gst INTEGER,
    street     VARCHAR(100),
    suburb     VARCHAR(100),
    contact    VARCHAR(50),
    phone      VARCHAR(50),
    Fax        VARCHAR(50),
    email      VARCHAR(100)
) DEFAULT CHARACTER SET utf8mb4 COLLATE utf8mb4_uca1400_as_ci;

-- CINFO: one row of the shop's settings
CREATE TABLE CINFO (
    QUOTE_PRE VARCHAR(10),
    QUOTE_VAL INTEGER,
    QUOTE_SUF VARCHAR(10),
    second_mu DOUBLE,
    recore_mu DOUBLE,
    after_mu  DOUBLE
) DEFAULT CHARACTER SET utf8mb4 COLLATE utf8mb4_uca1400_as_ci;

-- VENDOR: suppliers and sublet repairers
CREATE TABLE VENDOR (
    VENDOR_ID  INTEGER NOT NULL AUTO_INCREMENT PRIMARY KEY,
    NAME       VARCHAR(50),
    STREET     VARCHAR(100),
    SUBURB     VARCHAR(100),
    PHONE      VARCHAR(50),
    contact    VARCHAR(50),
    Fax        VARCHAR(50),
    email      VARCHAR(100),
    accno      VARCHAR(50),
    vendor_abn VARCHAR(50),
    Account    INTEGER
) DEFAULT CHARACTER SET utf8mb4 COLLATE utf8mb4_uca1400_as_ci;

CREATE TABLE ALLMODEL (
    MODEL_ID VARCHAR(20),
    MAKE     VARCHAR(50),
    MODEL    VARCHAR(50),
    SCHEDULE VARCHAR(20)
) DEFAULT CHARACTER SET utf8mb4 COLLATE utf8mb4_uca1400_as_ci;

CREATE TABLE MODEL (
    MODEL_ID  VARCHAR(20),
    MODEL_ID1 VARCHAR(20),
    MAKE      VARCHAR(50),
    MODEL     VARCHAR(50)
) DEFAULT CHARACTER SET utf8mb4 COLLATE utf8mb4_uca1400_as_ci;

CREATE TABLE BODY2 (
    body_id2   VARCHAR(10),
    body_desc2 VARCHAR(50)
) DEFAULT CHARACTER SET utf8mb4 COLLATE utf8mb4_uca1400_as_ci;

CREATE TABLE JOBSTAGE (
    stage       INTEGER,
    description VARCHAR(50)
) DEFAULT CHARACTER SET utf8mb4 COLLATE utf8mb4_uca1400_as_ci;

CREATE TABLE KESTColours (
    id     INTEGER,
    Code   VARCHAR(10),
    Script VARCHAR(50)
) DEFAULT CHARACTER SET utf8mb4 COLLATE utf8mb4_uca1400_as_ci;

CREATE TABLE SUBLET (
    Sublet INTEGER,
    Type   VARCHAR(10),
    Script VARCHAR(50)
) DEFAULT CHARACTER SET utf8mb4 COLLATE utf8mb4_uca1400_as_ci;

-- DEBTOR: the invoices of a quote
CREATE TABLE DEBTOR (
    QTNNO   VARCHAR(20),
    INVDATE DATETIME
) DEFAULT CHARACTER SET utf8mb4 COLLATE utf8mb4_uca1400_as_ci;

-- ExternalSettings: connection data of outside systems
CREATE TABLE ExternalSettings (
    TAG        VARCHAR(20),
    ServerName VARCHAR(100),
    Port       VARCHAR(10),
    Property1  VARCHAR(100),
    UserName   VARCHAR(100),
    passWord   VARCHAR(255)
) DEFAULT CHARACTER SET utf8mb4 COLLATE utf8mb4_uca1400_as_ci;

CREATE TABLE ReportDefinition (
    ReportID   INTEGER,
    ReportName VARCHAR(100)
) DEFAULT CHARACTER SET utf8mb4 COLLATE utf8mb4_uca1400_as_ci;
