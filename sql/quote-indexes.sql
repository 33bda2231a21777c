-- The indexes of the quote database, on every engine. They serve every search of this component that would otherwise take
-- longer with each quote of the shop. None is unique. The number of a quote leads to few rows, and without the subquote
-- in their index these rows stay in the order in which they were added, whatever the statement sorts by.
CREATE INDEX QUOTE1_QTNNO ON QUOTE1 (QTNNO);
CREATE INDEX QUOTE1_KESTQRNo ON QUOTE1 (KESTQRNo);
CREATE INDEX QUOTE1_KESTQuoteNo ON QUOTE1 (KESTQuoteNo);
CREATE INDEX QUOTE2_QTNNO ON QUOTE2 (QTNNO);
CREATE INDEX QUOTE3_QTNNO ON QUOTE3 (QTNNO);
CREATE INDEX CUSTOMER_NAME ON CUSTOMER (NAME);
CREATE INDEX DEBTOR_QTNNO ON DEBTOR (QTNNO);
